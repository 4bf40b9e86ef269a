#include "tool/SizeBars.h"

#include <algorithm>
#include <cmath>

#include "tool/SafeText.h"

namespace norvex {
namespace {

constexpr std::size_t kIndent = 2, kGap = 2, kLongestBar = 50;

std::string repeated(std::string_view text, std::size_t count) {
  std::string all;
  for (std::size_t i = 0; i < count; ++i) all += text;
  return all;
}

std::string spaces(std::size_t count) {
  return std::string(count, ' ');
}

// How many of `columns` stand for `part`; none when there is no whole.
std::size_t columnsFor(std::uint64_t part, std::uint64_t whole, std::size_t columns) {
  if (whole == 0) return 0;
  const double share = static_cast<double>(std::min(part, whole)) / static_cast<double>(whole);
  return static_cast<std::size_t>(std::lround(share * static_cast<double>(columns)));
}

}  // namespace

void writeSizeBars(Console& console, const ByteCountFormatter& byteCounts, const std::vector<SizeBar>& bars,
                   std::size_t labelColumns) {
  std::size_t sizeColumns = 0;
  std::uint64_t largest = 0;
  for (const SizeBar& bar : bars) {
    labelColumns = std::max(labelColumns, columnsOf(bar.label));
    sizeColumns = std::max(sizeColumns, columnsOf(byteCounts.string(bar.bytes)));
    largest = std::max(largest, bar.bytes);
  }
  const std::size_t taken = kIndent + labelColumns + kGap + sizeColumns + kGap;
  const std::size_t width = console.style().width;
  const std::size_t room = std::min(width > taken ? width - taken : 0, kLongestBar);
  for (const SizeBar& bar : bars) {
    const std::string size = byteCounts.string(bar.bytes);
    std::string line = spaces(kIndent) + bar.label + spaces(labelColumns - columnsOf(bar.label)) +
                       spaces(kGap + sizeColumns - columnsOf(size)) + size;
    line = fittingText(line, width);
    if (const std::size_t length = columnsFor(bar.bytes, largest, room); length > 0) {
      line += spaces(kGap) +
              console.inked(Console::Ink::bar, repeated(console.style().hasUtf8 ? "█" : "#", length));
    }
    console.stream() << line << '\n';
  }
}

std::string fillBar(const Console& console, std::size_t columns, std::uint64_t part, std::uint64_t whole) {
  const bool hasUtf8 = console.style().hasUtf8;
  const std::size_t filled = columnsFor(part, whole, columns);
  const std::string bar = console.inked(Console::Ink::bar, repeated(hasUtf8 ? "█" : "#", filled)) +
                          console.inked(Console::Ink::dim, repeated(hasUtf8 ? "░" : ".", columns - filled));
  return hasUtf8 ? bar : "[" + bar + "]";
}

}  // namespace norvex
