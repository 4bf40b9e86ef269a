#include "tool/HtmlText.h"

#include <algorithm>
#include <cmath>

#include "tool/SafeText.h"

namespace norvex {
namespace {

double shareOf(std::uint64_t part, std::uint64_t whole) {
  return whole == 0 ? 0 : std::min(1.0, static_cast<double>(part) / static_cast<double>(whole));
}

}  // namespace

std::string htmlText(std::string_view text) {
  std::string escaped;
  for (const char character : safeText(text)) {
    switch (character) {
      case '&':
        escaped += "&amp;";
        break;
      case '<':
        escaped += "&lt;";
        break;
      case '>':
        escaped += "&gt;";
        break;
      case '"':
        escaped += "&quot;";
        break;
      case '\'':
        escaped += "&#39;";
        break;
      default:
        escaped += character;
    }
  }
  return escaped;
}

std::string percentage(std::uint64_t part, std::uint64_t whole) {
  const auto tenths = std::lround(shareOf(part, whole) * 1000);
  return std::to_string(tenths / 10) + "." + std::to_string(tenths % 10) + "%";
}

std::string roundedPercentage(std::uint64_t part, std::uint64_t whole) {
  const double percent = shareOf(part, whole) * 100;
  return percent > 0 && percent < 1 ? "< 1 %" : std::to_string(std::lround(percent)) + " %";
}

}  // namespace norvex
