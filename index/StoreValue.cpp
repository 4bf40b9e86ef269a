#include "index/StoreValue.h"

#include <charconv>
#include <cstdint>
#include <optional>

#include "platform/Utf8.h"

namespace norvex {
namespace {

// Takes one or more digits from the front.
bool takeDigits(std::string_view& text) {
  const std::size_t count = text.find_first_not_of("0123456789");
  if (count == 0 || text.empty()) return false;
  text.remove_prefix(count == std::string_view::npos ? text.size() : count);
  return true;
}

bool takeSign(std::string_view& text) {
  if (text.empty() || (text.front() != '+' && text.front() != '-')) return false;
  text.remove_prefix(1);
  return true;
}

bool isNumber(std::string_view text) {
  takeSign(text);
  if (!takeDigits(text)) return false;
  if (text.starts_with('.')) {
    text.remove_prefix(1);
    if (!takeDigits(text)) return false;
  }
  if (text.starts_with('e') || text.starts_with('E')) {
    text.remove_prefix(1);
    takeSign(text);
    if (!takeDigits(text)) return false;
  }
  return text.empty();
}

template <typename Number>
std::optional<Number> parsed(std::string_view text) {
  if (text.starts_with('+')) text.remove_prefix(1);
  Number number{};
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  if (error != std::errc{} || end != text.data() + text.size()) return std::nullopt;
  return number;
}

}  // namespace

void bindStoreValue(sqlite3_stmt* statement, int index, std::string_view value) {
  if (value.ends_with('\n') || value.ends_with('\0')) value.remove_suffix(1);
  if (isNumber(value)) {
    if (const auto whole = parsed<std::int64_t>(value)) {
      sqlite3_bind_int64(statement, index, *whole);
      return;
    }
    if (const auto real = parsed<double>(value)) {
      sqlite3_bind_double(statement, index, *real);
      return;
    }
  }
  const char* bytes = value.empty() ? "" : value.data();  // no address would be bound as NULL
  const int length = static_cast<int>(value.size());
  const bool isText = isValidUtf8(value) && value.find('\0') == std::string_view::npos;
  if (isText) {
    sqlite3_bind_text(statement, index, bytes, length, SQLITE_STATIC);
  } else {
    sqlite3_bind_blob(statement, index, bytes, length, SQLITE_STATIC);
  }
}

}  // namespace norvex
