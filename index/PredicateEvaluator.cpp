#include "index/PredicateEvaluator.h"

#include <algorithm>

#include "index/ValueComparison.h"

namespace norvex {
namespace {

PredicateValueView viewOf(const PredicateValue& value) {
  return std::visit([](const auto& plain) { return PredicateValueView(plain); }, value);
}

bool holds(const AttributeTest& test, const AttributeReader& reader) {
  std::vector<ValueComparison> comparisons(test.conditions.begin(), test.conditions.end());
  const auto fulfilsAll = [&](const PredicateValue& value) {
    return std::ranges::all_of(comparisons, [&](const auto& each) { return each.holdsFor(viewOf(value)); });
  };
  return std::ranges::any_of(reader(test.attribute), fulfilsAll);
}

bool holds(const Connective& connective, const AttributeReader& reader) {
  const auto matches = [&](const Predicate& operand) { return matchesPredicate(operand, reader); };
  switch (connective.kind) {
    case Connective::Kind::All:
      return std::ranges::all_of(connective.operands, matches);
    case Connective::Kind::Any:
      return std::ranges::any_of(connective.operands, matches);
    case Connective::Kind::Not:
      return std::ranges::none_of(connective.operands, matches);
  }
  return false;
}

}  // namespace

bool matchesPredicate(const Predicate& predicate, const AttributeReader& reader) {
  return std::visit([&](const auto& term) { return holds(term, reader); }, predicate.term);
}

}  // namespace norvex
