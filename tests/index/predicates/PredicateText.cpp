#include "PredicateText.h"

#include <array>
#include <sstream>

namespace norvex::test {
namespace {

std::string textOf(const PredicateLiteral& literal) {
  if (std::holds_alternative<AnyValue>(literal)) return "*";
  if (const auto* const number = std::get_if<PlainNumber>(&literal)) {
    std::ostringstream text;
    std::visit([&](auto plain) { text << plain; }, *number);
    return std::holds_alternative<double>(*number) ? text.str() + "r" : text.str();
  }
  const auto& pattern = std::get<TextPattern>(literal);
  return "'" + sourceOfPattern(pattern) + "'" + (pattern.folding.ignoresCase ? "c" : "") +
         (pattern.folding.ignoresDiacritics ? "d" : "");
}

std::string textOf(const AttributeTest& test) {
  constexpr std::array operators{"==", "<", "<=", ">", ">="};
  std::string text = "(" + test.attribute;
  for (const auto& condition : test.conditions) {
    text += std::string(" ") + operators.at(static_cast<std::size_t>(condition.comparison)) + " " +
            textOf(condition.literal);
  }
  return text + ")";
}

std::string textOf(const Connective& connective) {
  if (connective.kind == Connective::Kind::Not)
    return "!" + norvex::test::textOf(connective.operands.front());
  std::string text;
  for (const Predicate& operand : connective.operands) {
    if (!text.empty()) text += connective.kind == Connective::Kind::All ? " && " : " || ";
    text += norvex::test::textOf(operand);
  }
  return "(" + text + ")";
}

}  // namespace

std::string textOf(const Predicate& predicate) {
  return std::visit([](const auto& term) { return textOf(term); }, predicate.term);
}

}  // namespace norvex::test
