// Reads the text of a predicate. The language stands in Predicate.h.
//
// Any thread. Pure.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <variant>

#include "index/Predicate.h"

namespace norvex {

// Bounds that no person's predicate reaches. They keep what a hostile one costs small, and hold its SQL
// within what SQLite takes: 1000 levels of an expression, 100 open levels while it is read.
inline constexpr std::size_t kMaxPredicateLength = 16384;     // bytes
inline constexpr std::size_t kMaxPredicateDepth = 32;         // parentheses and negations within each other
inline constexpr std::size_t kMaxPredicateComparisons = 500;  // tests of attributes

// Where and why a text is no predicate.
struct PredicateError {
  // 1-based, of what stands there instead, one behind the text when it ends too early. Counts characters;
  // bytes where the text is not UTF-8.
  std::size_t column = 0;
  std::string expected;  // "a value (a string in quotes, a number or *)"
  std::string message;   // a whole line for people: column, what was expected, what was found
};

// The predicate, or the first thing that is wrong with the text.
std::variant<Predicate, PredicateError> parsePredicate(std::string_view text);

}  // namespace norvex
