#include "tool/FigureText.h"

#include <time.h>

#include <array>
#include <cstdio>

namespace norvex {
namespace {

struct TimeUnit {
  std::int64_t seconds;
  const char* name;
};

// The largest unit of which there is at least one is shown.
constexpr std::array<TimeUnit, 3> kUnits{{{86400, "day"}, {3600, "hour"}, {60, "minute"}}};

std::string formatted(const tm& parts, const char* format) {
  std::array<char, 64> text{};
  return {text.data(), ::strftime(text.data(), text.size(), format, &parts)};
}

// What no calendar holds is shown as the number that it is.
std::string numberText(std::int64_t secondsSince1970) {
  return std::to_string(secondsSince1970) + " s since 1970";
}

}  // namespace

std::string localTime(std::int64_t secondsSince1970) {
  const time_t moment = secondsSince1970;
  tm parts{};
  if (::localtime_r(&moment, &parts) == nullptr) return numberText(secondsSince1970);
  return formatted(parts, "%Y-%m-%d %H:%M:%S %z");
}

std::string utcTime(std::int64_t secondsSince1970) {
  const time_t moment = secondsSince1970;
  tm parts{};
  if (::gmtime_r(&moment, &parts) == nullptr) return numberText(secondsSince1970);
  return formatted(parts, "%Y-%m-%dT%H:%M:%SZ");
}

std::string ageText(std::int64_t seconds) {
  for (const TimeUnit& unit : kUnits) {
    if (seconds < unit.seconds) continue;
    const std::int64_t count = seconds / unit.seconds;
    return std::to_string(count) + " " + unit.name + (count == 1 ? " ago" : "s ago");
  }
  return "just now";
}

std::string elapsedText(std::chrono::duration<double> elapsed) {
  const auto seconds = static_cast<long long>(elapsed.count());
  std::array<char, 48> text{};
  if (seconds < 3600) {
    std::snprintf(text.data(), text.size(), "%lld:%02lld", seconds / 60, seconds % 60);
  } else {
    std::snprintf(text.data(), text.size(), "%lld:%02lld:%02lld", seconds / 3600, seconds / 60 % 60,
                  seconds % 60);
  }
  return text.data();
}

std::string secondsText(std::chrono::duration<double> elapsed) {
  std::array<char, 48> text{};
  std::snprintf(text.data(), text.size(), "%.1f", elapsed.count());
  return text.data();
}

std::string countText(const DigitsText& digits, std::uint64_t count, const std::string& thing) {
  return digits(count) + " " + thing + (count == 1 ? "" : "s");
}

}  // namespace norvex
