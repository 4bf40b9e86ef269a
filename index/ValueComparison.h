// One condition of a predicate, made ready to be held against many values.
//
// Any thread. A plain value; pure.
#pragma once

#include <cstdint>
#include <optional>
#include <string_view>
#include <variant>

#include "index/Predicate.h"

namespace norvex {

// A value of an item, as its owner has it; the text is only looked at during the call.
using PredicateValueView = std::variant<std::int64_t, double, std::string_view>;

class ValueComparison {
 public:
  explicit ValueComparison(const PredicateCondition& condition);

  // Whether the value fulfils the condition.
  bool holdsFor(PredicateValueView value) const;

 private:
  PredicateOperator comparison_;
  bool takesAny_ = false;
  std::optional<PlainNumber> number_;  // the literal, or the number that it spells
  std::optional<TextMatcher> text_;
};

// The number that a literal is or spells; absent when it is neither.
std::optional<PlainNumber> numberOfLiteral(const PredicateLiteral& literal);

}  // namespace norvex
