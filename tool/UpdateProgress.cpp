#include "tool/UpdateProgress.h"

#include <numeric>

#include "tool/FigureText.h"
#include "tool/SafeText.h"

namespace norvex {
namespace {

std::uint64_t sumOf(const AccumulatedSizes& sizes) {
  // 18 numbers below 2^63 could pass 2^64: then the line is wrong for a moment, and nothing else.
  return std::accumulate(
      sizes.values().begin(), sizes.values().end(), std::uint64_t{0},
      [](std::uint64_t sum, std::int64_t size) { return sum + static_cast<std::uint64_t>(size); });
}

}  // namespace

UpdateProgress::UpdateProgress(ToolWorld& world, const std::string& volume, std::uint64_t expectedItems)
    : world_(world), volume_(volume), expectedItems_(expectedItems), line_(world.err, world.clock) {
  write({});
}

void UpdateProgress::show(const CrawlFigures& figures) {
  if (line_.isDue()) write(figures);
}

void UpdateProgress::write(const CrawlFigures& figures) {
  const auto elapsed = line_.elapsed();
  const std::uint64_t items = figures.files + figures.folders;
  const double done =
      expectedItems_ == 0 ? 0 : static_cast<double>(items) / static_cast<double>(expectedItems_);
  // What matters stands first: a narrow terminal cuts the rest off.
  line_.show(elapsedText(elapsed) + "  " + countText(world_.digits, items, "item") + ", " +
             world_.byteCounts.string(sumOf(figures.accumulatedSizes)) + ", " +
             world_.digits(perSecond(items, elapsed)) + " items/s" + remainingText(done, elapsed) + "  " +
             safeText(volume_));
}

}  // namespace norvex
