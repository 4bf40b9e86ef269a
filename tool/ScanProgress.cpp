#include "tool/ScanProgress.h"

#include "scanner/NVXScanner.h"
#include "tool/SafeText.h"

namespace norvex {
namespace {

// Asking the clock for each item would be felt.
constexpr std::uint64_t kItemsPerLook = 64;

}  // namespace

ScanProgress::ScanProgress(ToolWorld& world, std::size_t volumes)
    : world_(world),
      queries_(volumes * NVXScanner::queriesPerVolume),
      place_("folders of your own"),
      line_(world.err, world.clock) {
  showWhenDue();
}

void ScanProgress::queryStarts(const std::string& volume, bool started) {
  if (!started) refused_.push_back(volume);
  place_ = safeText(volume);
  doneOfQuery_ = 0;
  showWhenDue();
}

void ScanProgress::matchIsRead(std::size_t index, std::size_t count) {
  if (items_++ % kItemsPerLook != 0) return;
  doneOfQuery_ = static_cast<double>(index) / static_cast<double>(count);
  showWhenDue();
}

void ScanProgress::itemIsWalked() {
  if (items_++ % kItemsPerLook == 0) showWhenDue();
}

void ScanProgress::showWhenDue() {
  if (!line_.isDue()) return;
  const auto elapsed = line_.elapsed();
  const double done =
      queries_ == 0 ? 0 : (static_cast<double>(queriesDone_) + doneOfQuery_) / static_cast<double>(queries_);
  line_.show(elapsedText(elapsed) + "  " + countText(world_.digits, items_, "item") + " measured, " +
             world_.digits(perSecond(items_, elapsed)) + " items/s" + remainingText(done, elapsed) + "  " +
             place_);
}

}  // namespace norvex
