// Memory pressure where nobody reports it: a file of the kernel's is read once a window.
#pragma once

#include <functional>
#include <memory>
#include <string>

#include "platform/MemoryPressureSource.h"
#include "platform/linux/MemoryPressureText.h"
#include "platform/linux/PressureSensor.h"
#include "platform/linux/StallLimits.h"

namespace norvex {

// What is common to the two: the wait.
class PolledPressure : public PressureSensor {
 public:
  std::span<const pollfd> awaited() const final { return {}; }
  std::optional<std::chrono::milliseconds> interval() const final {
    return std::chrono::duration_cast<std::chrono::milliseconds>(kStallWindow);
  }
};

// By the totals of a memory.pressure file: pressure, when since the look before the time that tasks have
// waited has grown by as large a share of the time as the kernel's triggers ask for.
class PolledStallTotals final : public PolledPressure {
 public:
  // Null when the file cannot be read.
  static std::unique_ptr<PressureSensor> on(const std::string& path, MemoryPressureLevels levels,
                                            Clock::Moment now);

  PolledStallTotals(std::string path, MemoryPressureLevels levels, StallTotals totals, Clock::Moment now)
      : path_(std::move(path)), levels_(levels), totals_(totals), looked_(now) {}

  PressureVerdict judge(std::span<const pollfd> awaited, Clock::Moment now) override;

 private:
  std::string path_;
  MemoryPressureLevels levels_;
  StallTotals totals_;
  Clock::Moment looked_;
};

// By how much memory is left, for kernels that do not say how long tasks wait for it.
class PolledAvailableMemory final : public PolledPressure {
 public:
  // Less than this many thousandths of the memory being available is a warning, or critical.
  static constexpr std::uint64_t kWarningPermille = 100;
  static constexpr std::uint64_t kCriticalPermille = 50;

  // Null when the file (a meminfo file) cannot be read.
  static std::unique_ptr<PressureSensor> on(const std::string& path, MemoryPressureLevels levels);

  PolledAvailableMemory(std::string path, MemoryPressureLevels levels)
      : path_(std::move(path)), levels_(levels) {}

  PressureVerdict judge(std::span<const pollfd> awaited, Clock::Moment now) override;

 private:
  std::string path_;
  MemoryPressureLevels levels_;
};

}  // namespace norvex
