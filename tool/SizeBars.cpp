#include "tool/SizeBars.h"

#include <algorithm>
#include <cmath>
#include <string>
#include <vector>

#include "tool/SafeText.h"
#include "tool/StoragePositionNames.h"

namespace norvex {
namespace {

constexpr std::size_t kIndent = 2, kGap = 2, kLongestBar = 50;

struct Bar {
  std::string label, size;
  std::int64_t bytes = 0;
};

std::vector<Bar> barsOf(const ByteCountFormatter& byteCounts, const AccumulatedSizes::Values& sizes) {
  std::vector<Bar> bars;
  for (std::size_t at = 0; at < sizes.size(); ++at) {
    if (sizes[at] <= 0) continue;
    bars.push_back({kStoragePositionNames[at].label, byteCounts.string(static_cast<std::uint64_t>(sizes[at])),
                    sizes[at]});
  }
  std::stable_sort(bars.begin(), bars.end(), [](const Bar& a, const Bar& b) { return a.bytes > b.bytes; });
  return bars;
}

std::size_t widest(const std::vector<Bar>& bars, std::string Bar::*text) {
  std::size_t columns = 0;
  for (const Bar& bar : bars) columns = std::max(columns, columnsOf(bar.*text));
  return columns;
}

std::string repeated(std::string_view text, std::size_t count) {
  std::string all;
  for (std::size_t i = 0; i < count; ++i) all += text;
  return all;
}

}  // namespace

void writeSizeBars(Console& console, const ByteCountFormatter& byteCounts,
                   const AccumulatedSizes::Values& sizes) {
  const std::vector<Bar> bars = barsOf(byteCounts, sizes);
  const std::size_t labelColumns = widest(bars, &Bar::label), sizeColumns = widest(bars, &Bar::size);
  const std::size_t taken = kIndent + labelColumns + kGap + sizeColumns + kGap;
  const std::size_t width = console.style().width;
  const std::size_t room = std::min(width > taken ? width - taken : 0, kLongestBar);
  for (const Bar& bar : bars) {
    const double share = static_cast<double>(bar.bytes) / static_cast<double>(bars.front().bytes);
    const auto length = static_cast<std::size_t>(std::lround(share * static_cast<double>(room)));
    std::string line = repeated(" ", kIndent) + bar.label +
                       repeated(" ", labelColumns - columnsOf(bar.label)) +
                       repeated(" ", kGap + sizeColumns - columnsOf(bar.size)) + bar.size;
    line = fittingText(line, width);
    if (length > 0) {
      line += repeated(" ", kGap);
      line += console.inked(Console::Ink::bar, repeated(console.style().hasUtf8 ? "█" : "#", length));
    }
    console.stream() << line << '\n';
  }
}

}  // namespace norvex
