#include "tool/MomentText.h"

#include <time.h>

#include <array>
#include <charconv>
#include <string_view>

namespace norvex {
namespace {

struct Unit {
  std::string_view name;
  std::int64_t seconds;
};
constexpr std::array<Unit, 5> kUnits{{{"s", 1}, {"min", 60}, {"h", 3600}, {"d", 86400}, {"w", 604800}}};

struct Format {
  const char* text;
  bool isUtc;
};
constexpr std::array<Format, 4> kFormats{{{"%Y-%m-%dT%H:%M:%SZ", true},
                                          {"%Y-%m-%d %H:%M:%S", false},
                                          {"%Y-%m-%d %H:%M", false},
                                          {"%Y-%m-%d", false}}};

// A number of at most nine digits and a unit: "3d".
std::optional<std::int64_t> ageOf(std::string_view text) {
  constexpr std::size_t kMostDigits = 9;
  std::int64_t number = 0;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  const auto digits = static_cast<std::size_t>(end - text.data());
  if (error != std::errc() || digits > kMostDigits || number < 0) return std::nullopt;
  for (const Unit& unit : kUnits) {
    if (text.substr(digits) == unit.name) return number * unit.seconds;
  }
  return std::nullopt;
}

// The calendar moves the 31st of a short month on to the next one; such a day is refused.
std::optional<std::int64_t> secondsOf(tm parts, bool isUtc) {
  const int day = parts.tm_mday;
  parts.tm_isdst = -1;
  const time_t seconds = isUtc ? ::timegm(&parts) : ::mktime(&parts);
  if (parts.tm_mday != day) return std::nullopt;
  return seconds;
}

}  // namespace

std::optional<std::int64_t> momentOf(const std::string& text, std::int64_t now) {
  if (const auto age = ageOf(text)) return now - *age;
  if (text == "today") {
    const time_t moment = now;
    tm parts{};
    if (::localtime_r(&moment, &parts) == nullptr) return std::nullopt;
    parts.tm_hour = parts.tm_min = parts.tm_sec = 0;
    return secondsOf(parts, false);
  }
  for (const Format& format : kFormats) {
    tm parts{};
    const char* end = ::strptime(text.c_str(), format.text, &parts);
    if (end != nullptr && *end == '\0') return secondsOf(parts, format.isUtc);
  }
  return std::nullopt;
}

}  // namespace norvex
