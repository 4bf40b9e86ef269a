// Text and shares as HTML has them.
//
// Any thread. Pure.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace norvex {

// The text as content of an element or of a quoted attribute; what cannot be shown is escaped first, as on a
// terminal.
std::string htmlText(std::string_view text);

// `part` of `whole` with one digit, always with a point: "12.5%". "0.0%" when there is no whole; never more
// than "100.0%".
std::string percentage(std::uint64_t part, std::uint64_t whole);

// The same for people, as plain text: "13 %", "< 1 %".
std::string roundedPercentage(std::uint64_t part, std::uint64_t whole);

}  // namespace norvex
