#include "index/PredicateParser.h"

#include <algorithm>
#include <optional>
#include <utility>

#include "index/PredicateLexer.h"
#include "platform/Utf8.h"

namespace norvex {
namespace {

using Kind = PredicateToken::Kind;

constexpr std::string_view kExpectedTest = "a comparison (attribute, operator, value), InRange, ! or (";
constexpr std::string_view kExpectedOperator = "an operator (== != < <= > >=)";
constexpr std::string_view kExpectedValueOrAny = "a value (a string in quotes, a number or *)";
constexpr std::string_view kExpectedValue = "a value (a string in quotes or a number)";
constexpr std::string_view kExpectedNoWildcard = "a string without wildcards (\\* stands for a star)";

bool continuesCharacter(char c) {
  return (static_cast<unsigned char>(c) & 0xC0U) == 0x80;
}

// The beginning of a token as it can be shown on a terminal: control characters, also those of two bytes, and
// what is no character at all become "?".
std::string shown(std::string_view token) {
  constexpr std::size_t limit = 24;
  const bool isUtf8 = isValidUtf8(token);
  std::size_t length = std::min(token.size(), limit);
  while (isUtf8 && length < token.size() && continuesCharacter(token[length])) --length;
  std::string text(token.substr(0, length));
  for (std::size_t i = 0; i < text.size(); ++i) {
    const auto byte = static_cast<unsigned char>(text[i]);
    const bool followsC2 = i > 0 && token[i - 1] == '\xc2';
    const bool isControl = byte < 0x20 || byte == 0x7F || (followsC2 && byte < 0xA0);
    if (isControl && followsC2) text[i - 1] = '?';
    if (isControl || (byte >= 0x80 && !isUtf8)) text[i] = '?';
  }
  return length < token.size() ? text + "..." : text;
}

// Recursive descent: one method a rule of the language, absent when error_ says why. The depth of the
// recursion is bounded by kMaxPredicateDepth.
class Parser {
 public:
  explicit Parser(std::string_view source) : source_(source), lexer_(source), token_(lexer_.next()) {}

  std::variant<Predicate, PredicateError> parse() {
    auto predicate = any();
    if (predicate && token_.kind != Kind::End) predicate = failed("&&, || or the end");
    if (!predicate) return std::move(error_);
    return std::move(*predicate);
  }

 private:
  std::optional<Predicate> any() { return chain(Kind::Or, Connective::Kind::Any, &Parser::all); }
  std::optional<Predicate> all() { return chain(Kind::And, Connective::Kind::All, &Parser::one); }

  std::optional<Predicate> chain(Kind separator, Connective::Kind kind,
                                 std::optional<Predicate> (Parser::*operandRule)()) {
    std::vector<Predicate> operands;
    do {
      auto operand = (this->*operandRule)();
      if (!operand) return std::nullopt;
      operands.push_back(std::move(*operand));
    } while (accept(separator));
    if (operands.size() == 1) return std::move(operands.front());
    return Predicate{Connective{kind, std::move(operands)}};
  }

  std::optional<Predicate> one() {
    if (token_.kind == Kind::Attribute) return test();
    if (token_.kind != Kind::Not && token_.kind != Kind::Open) return failed(kExpectedTest);
    if (depth_ == kMaxPredicateDepth) {
      return failed("no more than " + std::to_string(kMaxPredicateDepth) + " levels of ! and (");
    }
    ++depth_;
    auto nested = accept(Kind::Not) ? negation() : group();
    --depth_;
    return nested;
  }

  std::optional<Predicate> negation() {
    auto operand = one();
    if (!operand) return std::nullopt;
    return negated(std::move(*operand));
  }

  static Predicate negated(Predicate operand) {
    Connective negation{Connective::Kind::Not, {}};
    negation.operands.push_back(std::move(operand));
    return Predicate{std::move(negation)};
  }

  std::optional<Predicate> group() {
    accept(Kind::Open);
    auto predicate = any();
    if (predicate && !accept(Kind::Close)) return failed("&&, || or )");
    return predicate;
  }

  std::optional<Predicate> test() {
    if (++comparisons_ > kMaxPredicateComparisons) {
      return failed("no more than " + std::to_string(kMaxPredicateComparisons) + " comparisons");
    }
    const std::string_view attribute = token_.source;
    advance();
    if (token_.kind == Kind::Open && isSameWord(attribute, "InRange")) return range();
    return comparison(attribute);
  }

  std::optional<Predicate> comparison(std::string_view attribute) {
    if (token_.kind != Kind::Operator) return failed(kExpectedOperator);
    const PredicateOperator comparison = token_.comparison;
    const bool isNegated = token_.isNegated;
    advance();
    auto literal = comparison == PredicateOperator::Equal ? valueOrAny() : value();
    if (!literal) return std::nullopt;
    Predicate predicate{AttributeTest{std::string(attribute), {{comparison, std::move(*literal)}}}};
    return isNegated ? negated(std::move(predicate)) : std::move(predicate);
  }

  std::optional<Predicate> range() {
    accept(Kind::Open);
    AttributeTest test;
    test.attribute = token_.source;
    if (!expect(Kind::Attribute, "an attribute")) return std::nullopt;
    for (const auto comparison : {PredicateOperator::GreaterOrEqual, PredicateOperator::LessOrEqual}) {
      if (!expect(Kind::Comma, "a comma")) return std::nullopt;
      auto bound = value();
      if (!bound) return std::nullopt;
      test.conditions.push_back({comparison, std::move(*bound)});
    }
    if (!expect(Kind::Close, ")")) return std::nullopt;
    return Predicate{std::move(test)};
  }

  std::optional<PredicateLiteral> valueOrAny() {
    if (token_.kind != Kind::Value && token_.kind != Kind::Anything) return failed(kExpectedValueOrAny);
    return takeLiteral();
  }

  std::optional<PredicateLiteral> value() {
    if (token_.kind != Kind::Value) return failed(kExpectedValue);
    const auto* const text = std::get_if<TextPattern>(&token_.literal);
    if (text != nullptr && text->hasWildcard()) return failed(kExpectedNoWildcard);
    return takeLiteral();
  }

  PredicateLiteral takeLiteral() {
    PredicateLiteral literal = std::move(token_.literal);
    advance();
    return literal;
  }

  void advance() { token_ = lexer_.next(); }

  bool accept(Kind kind) {
    if (token_.kind != kind) return false;
    advance();
    return true;
  }

  bool expect(Kind kind, std::string_view expected) {
    if (accept(kind)) return true;
    failed(expected);
    return false;
  }

  // A token that is broken in itself matters more than that it is not the one that was expected.
  std::nullopt_t failed(std::string_view expected) {
    const bool isBroken = token_.kind == Kind::Broken;
    error_ = errorAt(token_.offset, isBroken ? token_.expected : expected, token_.source);
    return std::nullopt;
  }

  PredicateError errorAt(std::size_t offset, std::string_view expected, std::string_view found) const {
    const std::size_t column = columnOf(offset);
    const std::string instead = found.empty() ? "the predicate ends there" : "found: " + shown(found);
    return {column, std::string(expected),
            "column " + std::to_string(column) + ": expected " + std::string(expected) + ", but " + instead};
  }

  std::size_t columnOf(std::size_t offset) const {
    if (!isValidUtf8(source_)) return offset + 1;
    const auto before = source_.substr(0, offset);
    return before.size() - static_cast<std::size_t>(std::ranges::count_if(before, continuesCharacter)) + 1;
  }

  std::string_view source_;
  PredicateLexer lexer_;
  PredicateToken token_;
  PredicateError error_;
  std::size_t depth_ = 0;
  std::size_t comparisons_ = 0;
};

}  // namespace

std::variant<Predicate, PredicateError> parsePredicate(std::string_view text) {
  if (text.size() <= kMaxPredicateLength) return Parser(text).parse();
  // Nothing of so long a text is read, so the column counts its bytes.
  const std::size_t column = kMaxPredicateLength + 1;
  const std::string expected = "no more than " + std::to_string(kMaxPredicateLength) + " bytes";
  return PredicateError{column, expected, "column " + std::to_string(column) + ": expected " + expected};
}

}  // namespace norvex
