// Moments as people write them.
//
// Any thread. Pure, but for the user's time zone.
#pragma once

#include <cstdint>
#include <optional>
#include <string>

namespace norvex {

// Seconds since 1970 of "2026-11-21", "2026-11-21 07:03", "2026-11-21 07:03:11" (in the user's time zone),
// "2026-11-21T07:03:11Z", "today", or of "45min", "12h", "3d" and "2w" before `now`. Absent for anything else
// and for days that no calendar has.
std::optional<std::int64_t> momentOf(const std::string& text, std::int64_t now);

}  // namespace norvex
