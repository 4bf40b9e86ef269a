#include "platform/linux/LocaleByteCountFormatter.h"

#include <locale.h>
#include <climits>
#include <clocale>
#include <cwchar>
#include <iterator>
#include <optional>
#include <string_view>

namespace norvex {
namespace {

struct Unit {
  std::string_view name;
  std::uint64_t bytes;
  int fractionDigits;
};

// From the largest; below the smallest, single bytes are counted.
constexpr Unit kUnits[] = {
    {"EB", 1'000'000'000'000'000'000, 2},
    {"PB", 1'000'000'000'000'000, 2},
    {"TB", 1'000'000'000'000, 2},
    {"GB", 1'000'000'000, 2},
    {"MB", 1'000'000, 1},
    {"KB", 1'000, 0},
};

constexpr std::uint64_t kPowersOfTen[] = {1, 10, 100};

// A locale for the calling thread alone, as long as the object lives. Does nothing when there is none of
// that name.
class ThreadLocale {
 public:
  explicit ThreadLocale(const std::string& name)
      : locale_(::newlocale(LC_NUMERIC_MASK | LC_CTYPE_MASK, name.c_str(), nullptr)) {
    if (locale_ != nullptr) previous_ = ::uselocale(locale_);
  }
  ~ThreadLocale() {
    if (locale_ == nullptr) return;
    ::uselocale(previous_);
    ::freelocale(locale_);
  }
  ThreadLocale(const ThreadLocale&) = delete;
  ThreadLocale& operator=(const ThreadLocale&) = delete;

  explicit operator bool() const { return locale_ != nullptr; }

 private:
  locale_t locale_ = nullptr;
  locale_t previous_ = nullptr;
};

void appendUtf8(std::string& text, char32_t character) {
  const auto append = [&text](char32_t byte) { text += static_cast<char>(byte); };
  if (character < 0x80) {
    append(character);
  } else if (character < 0x800) {
    append(0xC0 | (character >> 6));
    append(0x80 | (character & 0x3F));
  } else if (character < 0x10000) {
    append(0xE0 | (character >> 12));
    append(0x80 | ((character >> 6) & 0x3F));
    append(0x80 | (character & 0x3F));
  } else {
    append(0xF0 | (character >> 18));
    append(0x80 | ((character >> 12) & 0x3F));
    append(0x80 | ((character >> 6) & 0x3F));
    append(0x80 | (character & 0x3F));
  }
}

// Text in the character set of the thread's locale as UTF-8; absent when it is none in that set.
std::optional<std::string> utf8(std::string_view text) {
  std::string converted;
  std::mbstate_t state{};
  while (!text.empty()) {
    wchar_t character = 0;
    const std::size_t length = std::mbrtowc(&character, text.data(), text.size(), &state);
    if (length == 0 || length > text.size()) return std::nullopt;
    appendUtf8(converted, static_cast<char32_t>(character));
    text.remove_prefix(length);
  }
  return converted;
}

// bytes / step, the nearest whole number, the even one of two that are equally near.
std::uint64_t dividedHalfToEven(std::uint64_t bytes, std::uint64_t step) {
  const std::uint64_t quotient = bytes / step;
  const std::uint64_t rest = bytes % step;
  const bool up = rest > step - rest || (rest == step - rest && quotient % 2 == 1);
  return quotient + (up ? 1 : 0);
}

// The fraction's digits without trailing zeros.
std::string fractionText(std::uint64_t fraction, int digits) {
  std::string text = std::to_string(fraction);
  text.insert(0, static_cast<std::size_t>(digits) - text.size(), '0');
  text.erase(text.find_last_not_of('0') + 1);
  return text;
}

}  // namespace

LocaleByteCountFormatter::LocaleByteCountFormatter(const std::string& localeName) {
  const ThreadLocale locale(localeName);
  if (!locale) return;
  const lconv* conventions = ::localeconv();
  const std::optional<std::string> decimalSeparator = utf8(conventions->decimal_point);
  const std::optional<std::string> thousandsSeparator = utf8(conventions->thousands_sep);
  if (!decimalSeparator || decimalSeparator->empty() || !thousandsSeparator) return;
  decimalSeparator_ = *decimalSeparator;
  thousandsSeparator_ = *thousandsSeparator;
  grouping_ = conventions->grouping;
}

std::string LocaleByteCountFormatter::string(std::uint64_t bytes) const {
  if (bytes == 0) return "Zero KB";
  if (bytes == 1) return "1 byte";
  for (const Unit& unit : kUnits) {
    if (bytes < unit.bytes) continue;
    const std::uint64_t scale = kPowersOfTen[unit.fractionDigits];
    const std::uint64_t shown = dividedHalfToEven(bytes, unit.bytes / scale);
    std::string text = grouped(shown / scale);
    if (shown % scale != 0) text += decimalSeparator_ + fractionText(shown % scale, unit.fractionDigits);
    return text.append(" ").append(unit.name);
  }
  return grouped(bytes) + " bytes";
}

std::string LocaleByteCountFormatter::grouped(std::uint64_t number) const {
  std::string text = std::to_string(number);
  if (thousandsSeparator_.empty()) return text;
  std::size_t groupStart = text.size();
  for (std::size_t group = 0; !grouping_.empty(); ++group) {
    const char size = grouping_[group < grouping_.size() ? group : grouping_.size() - 1];
    if (size <= 0 || size == CHAR_MAX || groupStart <= static_cast<std::size_t>(size)) break;
    groupStart -= static_cast<std::size_t>(size);
    text.insert(groupStart, thousandsSeparator_);
  }
  return text;
}

}  // namespace norvex
