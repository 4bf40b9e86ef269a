#include "index/PredicateLexer.h"

#include <algorithm>
#include <array>

namespace norvex {
namespace {

using Kind = PredicateToken::Kind;

struct Symbol {
  std::string_view spelling;
  Kind kind;
  PredicateOperator comparison = PredicateOperator::Equal;
  bool isNegated = false;
};

// Longer spellings before their beginnings.
constexpr std::array kSymbols{
    Symbol{"==", Kind::Operator, PredicateOperator::Equal},
    Symbol{"=", Kind::Operator, PredicateOperator::Equal},
    Symbol{"!=", Kind::Operator, PredicateOperator::Equal, true},
    Symbol{"<=", Kind::Operator, PredicateOperator::LessOrEqual},
    Symbol{"<", Kind::Operator, PredicateOperator::Less},
    Symbol{">=", Kind::Operator, PredicateOperator::GreaterOrEqual},
    Symbol{">", Kind::Operator, PredicateOperator::Greater},
    Symbol{"&&", Kind::And},
    Symbol{"||", Kind::Or},
    Symbol{"!", Kind::Not},
    Symbol{"(", Kind::Open},
    Symbol{")", Kind::Close},
    Symbol{",", Kind::Comma},
    Symbol{"*", Kind::Anything},
};

constexpr std::array kWords{Symbol{"and", Kind::And}, Symbol{"or", Kind::Or}, Symbol{"not", Kind::Not}};

constexpr std::string_view kBlanks = " \t\n\v\f\r";

// The locale has no say in the language, so <cctype> is not asked.
bool isLetter(char c) {
  return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z');
}
bool isDigit(char c) {
  return c >= '0' && c <= '9';
}
bool beginsWord(char c) {
  return isLetter(c) || c == '_' || static_cast<unsigned char>(c) >= 0x80;
}
bool continuesWord(char c) {
  return beginsWord(c) || isDigit(c) || c == '.' || c == ':' || c == '-';
}

char lowered(char c) {
  return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
}

// How many bytes at the front of `text` fulfil `fits`.
template <typename Fits>
std::size_t lengthOf(std::string_view text, Fits fits) {
  return static_cast<std::size_t>(std::ranges::find_if_not(text, fits) - text.begin());
}

// A number's bytes reach as far as anybody could have meant them to, so that "1x" is a bad number and not a
// number with something behind it.
std::size_t lengthOfNumber(std::string_view text) {
  std::size_t length = 1;
  while (length < text.size()) {
    const bool followsExponent = lowered(text[length - 1]) == 'e';
    const bool isSign = text[length] == '+' || text[length] == '-';
    if (!continuesWord(text[length]) && !(isSign && followsExponent)) break;
    if (isSign && !followsExponent) break;
    ++length;
  }
  return length;
}

}  // namespace

bool isSameWord(std::string_view left, std::string_view right) {
  return std::ranges::equal(left, right, {}, lowered, lowered);
}

PredicateToken PredicateLexer::next() {
  position_ = std::min(source_.find_first_not_of(kBlanks, position_), source_.size());
  if (position_ == source_.size()) return take(Kind::End, 0);
  const char first = source_[position_];
  if (first == '\'' || first == '"') return text();
  if (isDigit(first) || first == '-' || first == '+') return number();
  return beginsWord(first) ? word() : symbol();
}

PredicateToken PredicateLexer::text() {
  const std::string_view rest = source_.substr(position_);
  const char quote = rest.front();
  std::size_t end = 1;
  while (end < rest.size() && rest[end] != quote) end += rest[end] == '\\' ? 2 : 1;
  if (end >= rest.size()) {
    return broken(source_.size(), quote == '"' ? "a closing quote (\")" : "a closing quote (')");
  }
  TextFolding folding;
  const std::size_t modifiers = lengthOf(rest.substr(end + 1), continuesWord);
  for (const char modifier : rest.substr(end + 1, modifiers)) {
    if (modifier != 'c' && modifier != 'd') {
      return broken(position_ + end + 1, "the modifiers c (any case), d (any diacritics) or none");
    }
    (modifier == 'c' ? folding.ignoresCase : folding.ignoresDiacritics) = true;
  }
  auto token = take(Kind::Value, end + 1 + modifiers);
  token.literal = patternFromSource(rest.substr(1, end - 1), folding);
  return token;
}

PredicateToken PredicateLexer::number() {
  const std::size_t length = lengthOfNumber(source_.substr(position_));
  const auto number = numberFromText(source_.substr(position_, length));
  if (!number) return broken(position_, "a number such as 5, -1.5 or 2e9, in the range of a double");
  auto token = take(Kind::Value, length);
  token.literal = *number;
  return token;
}

PredicateToken PredicateLexer::word() {
  const std::size_t length = lengthOf(source_.substr(position_), continuesWord);
  const std::string_view word = source_.substr(position_, length);
  for (const Symbol& reserved : kWords) {
    if (isSameWord(reserved.spelling, word)) return take(reserved.kind, length);
  }
  return take(Kind::Attribute, length);
}

PredicateToken PredicateLexer::symbol() {
  const std::string_view rest = source_.substr(position_);
  for (const Symbol& symbol : kSymbols) {
    if (!rest.starts_with(symbol.spelling)) continue;
    auto token = take(symbol.kind, symbol.spelling.size());
    token.comparison = symbol.comparison;
    token.isNegated = symbol.isNegated;
    return token;
  }
  return take(Kind::Unknown, 1);
}

PredicateToken PredicateLexer::take(Kind kind, std::size_t length) {
  PredicateToken token;
  token.kind = kind;
  token.offset = position_;
  token.source = source_.substr(position_, length);
  position_ += length;
  return token;
}

// The lexer stays where it is: the parser ends at the first broken token.
PredicateToken PredicateLexer::broken(std::size_t offset, std::string_view expected) const {
  PredicateToken token;
  token.kind = Kind::Broken;
  token.offset = offset;
  token.source =
      source_.substr(offset, std::max<std::size_t>(1, lengthOf(source_.substr(offset), continuesWord)));
  token.expected = expected;
  return token;
}

}  // namespace norvex
