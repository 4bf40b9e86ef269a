#include "tool/ProgressLine.h"

#include "tool/FigureText.h"
#include "tool/SafeText.h"

namespace norvex {
namespace {

constexpr std::string_view kEraseLine = "\r\x1b[2K";

// Before this much has been done, or this much time has passed, an estimate would jump about.
constexpr double kLeastDone = 0.02;
constexpr std::chrono::duration<double> kLeastElapsed{0.3};

}  // namespace

std::uint64_t perSecond(std::uint64_t count, std::chrono::duration<double> elapsed) {
  return elapsed.count() > 0 ? static_cast<std::uint64_t>(static_cast<double>(count) / elapsed.count()) : 0;
}

std::string remainingText(double done, std::chrono::duration<double> elapsed) {
  if (done < kLeastDone || done >= 1 || elapsed < kLeastElapsed) return {};
  return ", about " + elapsedText(elapsed * ((1 - done) / done)) + " left";
}

ProgressLine::ProgressLine(Console& console, const Clock& clock)
    : console_(console), clock_(clock), started_(clock.now()) {}

ProgressLine::~ProgressLine() {
  erase();
}

bool ProgressLine::isDue() const {
  if (!console_.style().isTerminal) return false;
  return !shown_ || clock_.now() - *shown_ >= kInterval;
}

void ProgressLine::show(std::string_view text) {
  if (!console_.style().isTerminal) return;
  shown_ = clock_.now();
  isOnScreen_ = true;
  // The last column stays free: some terminals go to the next line once it is filled.
  console_.stream() << kEraseLine << fittingText(text, console_.style().width - 1) << std::flush;
}

void ProgressLine::erase() {
  if (!isOnScreen_) return;
  isOnScreen_ = false;
  console_.stream() << kEraseLine << std::flush;
}

}  // namespace norvex
