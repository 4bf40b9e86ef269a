#include "index/ValueComparison.h"

#include <compare>

namespace norvex {
namespace {

bool fulfils(PredicateOperator comparison, std::partial_ordering order) {
  switch (comparison) {
    case PredicateOperator::Equal:
      return std::is_eq(order);
    case PredicateOperator::Less:
      return std::is_lt(order);
    case PredicateOperator::LessOrEqual:
      return std::is_lteq(order);
    case PredicateOperator::Greater:
      return std::is_gt(order);
    case PredicateOperator::GreaterOrEqual:
      return std::is_gteq(order);
  }
  return false;
}

}  // namespace

std::optional<PlainNumber> numberOfLiteral(const PredicateLiteral& literal) {
  if (const auto* const number = std::get_if<PlainNumber>(&literal)) return *number;
  const auto* const text = std::get_if<TextPattern>(&literal);
  if (text == nullptr || text->hasWildcard()) return std::nullopt;
  return numberFromText(text->pieces.front());
}

ValueComparison::ValueComparison(const PredicateCondition& condition)
    : comparison_(condition.comparison),
      takesAny_(std::holds_alternative<AnyValue>(condition.literal)),
      number_(numberOfLiteral(condition.literal)) {
  if (const auto* const text = std::get_if<TextPattern>(&condition.literal)) text_.emplace(*text);
}

bool ValueComparison::holdsFor(PredicateValueView value) const {
  if (takesAny_) return true;
  const auto* const text = std::get_if<std::string_view>(&value);
  if (text != nullptr && text_) {
    return comparison_ == PredicateOperator::Equal ? text_->matches(*text)
                                                   : fulfils(comparison_, text_->compare(*text));
  }
  if (!number_) return false;
  std::optional<PlainNumber> number;
  if (text != nullptr) {
    number = numberFromText(*text);
  } else if (const auto* const whole = std::get_if<std::int64_t>(&value)) {
    number = *whole;
  } else {
    number = std::get<double>(value);
  }
  return number && fulfils(comparison_, compareNumbers(*number, *number_));
}

}  // namespace norvex
