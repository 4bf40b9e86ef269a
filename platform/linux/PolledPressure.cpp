#include "platform/linux/PolledPressure.h"

#include "platform/linux/Files.h"

namespace norvex {
namespace {

using std::chrono::microseconds;

constexpr std::size_t kLargestFile = std::size_t{64} * 1024;

std::string textOf(const std::string& path) {
  Result<std::string> text = readWholeFile(path, kLargestFile);
  return text ? std::move(text).value() : std::string();
}

// Whether `waited` is as large a part of the time that has passed as `stall` is of the window.
bool isStalled(microseconds waited, microseconds passed, microseconds stall) {
  return static_cast<double>(waited.count()) * static_cast<double>(kStallWindow.count()) >=
         static_cast<double>(passed.count()) * static_cast<double>(stall.count());
}

PressureVerdict verdictOf(bool isPressure) {
  return isPressure ? PressureVerdict::pressure : PressureVerdict::calm;
}

}  // namespace

std::unique_ptr<PressureSensor> PolledStallTotals::on(const std::string& path, MemoryPressureLevels levels,
                                                      Clock::Moment now) {
  const std::optional<StallTotals> totals = stallTotalsIn(textOf(path));
  if (!totals) return nullptr;
  return std::make_unique<PolledStallTotals>(path, levels, *totals, now);
}

PressureVerdict PolledStallTotals::judge(std::span<const pollfd>, Clock::Moment now) {
  const std::optional<StallTotals> totals = stallTotalsIn(textOf(path_));
  if (!totals) return PressureVerdict::gone;
  const auto passed = std::chrono::duration_cast<microseconds>(now - looked_);
  if (passed <= microseconds::zero()) return PressureVerdict::calm;
  const microseconds some = totals->some - totals_.some;
  const microseconds full = totals->full - totals_.full;
  totals_ = *totals;
  looked_ = now;
  return verdictOf((levels_.warning && isStalled(some, passed, kWarningStall)) ||
                   (levels_.critical && isStalled(full, passed, kCriticalStall)));
}

std::unique_ptr<PressureSensor> PolledAvailableMemory::on(const std::string& path,
                                                          MemoryPressureLevels levels) {
  if (!availablePermilleIn(textOf(path))) return nullptr;
  return std::make_unique<PolledAvailableMemory>(path, levels);
}

PressureVerdict PolledAvailableMemory::judge(std::span<const pollfd>, Clock::Moment) {
  const std::optional<std::uint64_t> available = availablePermilleIn(textOf(path_));
  if (!available) return PressureVerdict::gone;
  return verdictOf((levels_.warning && *available < kWarningPermille) ||
                   (levels_.critical && *available < kCriticalPermille));
}

}  // namespace norvex
