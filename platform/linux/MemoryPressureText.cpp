#include "platform/linux/MemoryPressureText.h"

#include <charconv>
#include <limits>

namespace norvex {
namespace {

constexpr std::uint64_t kThousand = 1000;

// The rest of the line that begins with `start`.
std::optional<std::string_view> lineAfter(std::string_view text, std::string_view start) {
  while (!text.empty()) {
    const std::size_t end = text.find('\n');
    const std::string_view line = text.substr(0, end);
    if (line.starts_with(start)) return line.substr(start.size());
    if (end == std::string_view::npos) break;
    text.remove_prefix(end + 1);
  }
  return std::nullopt;
}

// The number at the start of `text`, after blanks.
std::optional<std::uint64_t> numberIn(std::string_view text) {
  text.remove_prefix(std::min(text.find_first_not_of(' '), text.size()));
  std::uint64_t number = 0;
  if (std::from_chars(text.data(), text.data() + text.size(), number).ec != std::errc()) return std::nullopt;
  return number;
}

std::optional<std::chrono::microseconds> totalOf(std::string_view pressureFile, std::string_view kind) {
  constexpr std::string_view kTotal = " total=";
  const std::optional<std::string_view> line = lineAfter(pressureFile, kind);
  if (!line) return std::nullopt;
  const std::size_t at = line->find(kTotal);
  if (at == std::string_view::npos) return std::nullopt;
  const std::optional<std::uint64_t> total = numberIn(line->substr(at + kTotal.size()));
  if (!total || *total > static_cast<std::uint64_t>(std::numeric_limits<std::int64_t>::max())) {
    return std::nullopt;
  }
  return std::chrono::microseconds(*total);
}

}  // namespace

std::optional<StallTotals> stallTotalsIn(std::string_view pressureFile) {
  const auto some = totalOf(pressureFile, "some");
  const auto full = totalOf(pressureFile, "full");
  if (!some || !full) return std::nullopt;
  return StallTotals{*some, *full};
}

std::optional<std::uint64_t> availablePermilleIn(std::string_view memoryInfo) {
  const auto total = numberIn(lineAfter(memoryInfo, "MemTotal:").value_or(""));
  const auto available = numberIn(lineAfter(memoryInfo, "MemAvailable:").value_or(""));
  constexpr std::uint64_t kMost = std::numeric_limits<std::uint64_t>::max() / kThousand;
  if (!total || !available || *total == 0 || *available > kMost) return std::nullopt;
  return *available * kThousand / *total;
}

}  // namespace norvex
