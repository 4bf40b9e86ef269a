// How long work may wait for memory before that counts as pressure.
//
// Constants.
#pragma once

#include <chrono>

namespace norvex {

// The stretch of time that is looked at. Windows of two seconds need no privilege.
inline constexpr std::chrono::microseconds kStallWindow = std::chrono::seconds(2);

// Of each window: a warning when some task has waited for this long,
inline constexpr std::chrono::microseconds kWarningStall = std::chrono::milliseconds(150);
// critical when all tasks at once have.
inline constexpr std::chrono::microseconds kCriticalStall = std::chrono::milliseconds(100);

}  // namespace norvex
