// When a text is a number: one reading for the numbers of predicates and for the values that are held against
// them.
//
// Any thread. Pure.
#pragma once

#include <compare>
#include <cstdint>
#include <optional>
#include <string_view>
#include <variant>

namespace norvex {

// A whole number that fits is kept as one, so that no digit of it is lost.
using PlainNumber = std::variant<std::int64_t, double>;

// The number that `text` spells: an optional sign, digits, an optional fraction and exponent, nothing around.
// Absent when it spells none, or one outside of what a double holds.
std::optional<PlainNumber> numberFromText(std::string_view text);

// Compares by the exact values: a whole number is never rounded to a double first.
std::partial_ordering compareNumbers(PlainNumber left, PlainNumber right);

}  // namespace norvex
