#include "index/NumberText.h"

#include <charconv>
#include <system_error>

namespace norvex {
namespace {

bool isDigit(char c) {
  return c >= '0' && c <= '9';
}

// Removes the digits at the front of `rest`; false when there are none.
bool takeDigits(std::string_view& rest) {
  std::size_t count = 0;
  while (count < rest.size() && isDigit(rest[count])) ++count;
  rest.remove_prefix(count);
  return count > 0;
}

bool takeOneOf(std::string_view& rest, std::string_view characters) {
  if (rest.empty() || characters.find(rest.front()) == std::string_view::npos) return false;
  rest.remove_prefix(1);
  return true;
}

enum class Spelling { None, Whole, Fractional };

// Decided here and not by the conversions, which also read "inf", "1." and "0x1p3".
Spelling spellingOf(std::string_view unsignedText) {
  if (!takeDigits(unsignedText)) return Spelling::None;
  auto spelling = Spelling::Whole;
  if (takeOneOf(unsignedText, ".")) {
    if (!takeDigits(unsignedText)) return Spelling::None;
    spelling = Spelling::Fractional;
  }
  if (takeOneOf(unsignedText, "eE")) {
    takeOneOf(unsignedText, "+-");
    if (!takeDigits(unsignedText)) return Spelling::None;
    spelling = Spelling::Fractional;
  }
  return unsignedText.empty() ? spelling : Spelling::None;
}

std::partial_ordering compareMixed(std::int64_t whole, double real) {
  // 2^63: from here on every double is above every whole number, and below the negative of it below every
  // one.
  constexpr double limit = 9223372036854775808.0;
  if (real != real) return std::partial_ordering::unordered;
  if (real >= limit) return std::partial_ordering::less;
  if (real < -limit) return std::partial_ordering::greater;
  const auto truncated = static_cast<std::int64_t>(real);
  if (whole != truncated) return whole <=> truncated;
  return 0.0 <=> real - static_cast<double>(truncated);
}

std::partial_ordering reversed(std::partial_ordering order) {
  if (std::is_lt(order)) return std::partial_ordering::greater;
  if (std::is_gt(order)) return std::partial_ordering::less;
  return order;
}

}  // namespace

std::optional<PlainNumber> numberFromText(std::string_view text) {
  std::string_view unsignedText = text;
  const bool isSigned = takeOneOf(unsignedText, "+-");
  const Spelling spelling = spellingOf(unsignedText);
  if (spelling == Spelling::None) return std::nullopt;
  // The conversions know no plus sign.
  const std::string_view convertible = isSigned && text.front() == '+' ? unsignedText : text;
  const char* const begin = convertible.data();
  const char* const end = begin + convertible.size();

  std::int64_t whole = 0;
  if (spelling == Spelling::Whole && std::from_chars(begin, end, whole).ec == std::errc()) return whole;
  double real = 0;
  if (std::from_chars(begin, end, real).ec == std::errc()) return real;
  return std::nullopt;
}

std::partial_ordering compareNumbers(PlainNumber left, PlainNumber right) {
  const auto* const leftWhole = std::get_if<std::int64_t>(&left);
  const auto* const rightWhole = std::get_if<std::int64_t>(&right);
  if (leftWhole != nullptr && rightWhole != nullptr) return *leftWhole <=> *rightWhole;
  if (leftWhole != nullptr) return compareMixed(*leftWhole, std::get<double>(right));
  if (rightWhole != nullptr) return reversed(compareMixed(*rightWhole, std::get<double>(left)));
  return std::get<double>(left) <=> std::get<double>(right);
}

}  // namespace norvex
