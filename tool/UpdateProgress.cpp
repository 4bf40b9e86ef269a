#include "tool/UpdateProgress.h"

#include <numeric>

#include "tool/FigureText.h"
#include "tool/SafeText.h"

namespace norvex {
namespace {

constexpr std::string_view kEraseLine = "\r\x1b[2K";

std::uint64_t sumOf(const AccumulatedSizes& sizes) {
  // 18 numbers below 2^63 could pass 2^64: then the line is wrong for a moment, and nothing else.
  return std::accumulate(
      sizes.values().begin(), sizes.values().end(), std::uint64_t{0},
      [](std::uint64_t sum, std::int64_t size) { return sum + static_cast<std::uint64_t>(size); });
}

}  // namespace

std::uint64_t perSecond(std::uint64_t count, std::chrono::duration<double> elapsed) {
  return elapsed.count() > 0 ? static_cast<std::uint64_t>(static_cast<double>(count) / elapsed.count()) : 0;
}

UpdateProgress::UpdateProgress(Console& console, const Clock& clock, const ByteCountFormatter& byteCounts,
                               const std::string& volume)
    : console_(console),
      clock_(clock),
      byteCounts_(byteCounts),
      volume_(volume),
      started_(clock.now()),
      lastShown_(started_) {
  if (console_.style().isTerminal) write({}, started_);
}

UpdateProgress::~UpdateProgress() {
  if (console_.style().isTerminal) console_.stream() << kEraseLine << std::flush;
}

void UpdateProgress::show(const CrawlFigures& figures) {
  if (!console_.style().isTerminal) return;
  const Clock::Moment now = clock_.now();
  if (now - lastShown_ < kInterval) return;
  lastShown_ = now;
  write(figures, now);
}

void UpdateProgress::write(const CrawlFigures& figures, Clock::Moment now) {
  const auto elapsed = now - started_;
  const std::string line = safeText(volume_) + "  " + elapsedText(elapsed) + "  " +
                           countText(figures.files, "file") + ", " + countText(figures.folders, "folder") +
                           ", " + byteCounts_.string(sumOf(figures.accumulatedSizes)) + ", " +
                           std::to_string(perSecond(figures.files + figures.folders, elapsed)) + " items/s";
  // The last column stays free: some terminals go to the next line once it is filled.
  console_.stream() << std::string(kEraseLine) + fittingText(line, console_.style().width - 1) << std::flush;
}

}  // namespace norvex
