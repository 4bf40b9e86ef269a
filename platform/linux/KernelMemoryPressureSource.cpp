#include "platform/linux/KernelMemoryPressureSource.h"

#include <sys/eventfd.h>

#include <cerrno>
#include <system_error>
#include <thread>
#include <utility>

#include "platform/linux/Base64.h"
#include "platform/linux/ControlGroup.h"
#include "platform/linux/FileDescriptor.h"
#include "platform/linux/PolledPressure.h"
#include "platform/linux/PressureTriggers.h"

namespace norvex {
namespace {

constexpr const char* kSystemPressure = "/proc/pressure/memory";
constexpr const char* kPressureFileName = "/memory.pressure";
constexpr const char* kNoWatch = "/dev/null";  // how the service manager says that there is to be none

// Makes the sensor of one way; null when the way is closed.
using MakeSensor = std::function<std::unique_ptr<PressureSensor>()>;

std::unique_ptr<PressureSensor> orNull(Result<std::unique_ptr<PressureSensor>> sensor) {
  return sensor ? std::move(sensor).value() : nullptr;
}

std::vector<MakeSensor> waysTo(const MemoryPressurePlaces& places, MemoryPressureLevels levels,
                               const Clock& clock) {
  std::vector<MakeSensor> ways;
  if (places.isOff) return ways;
  if (!places.watch.empty()) {
    ways.emplace_back([places] { return orNull(PressureTriggers::onWatch(places.watch, places.watchText)); });
  }
  for (const std::string& file : places.pressureFiles) {
    ways.emplace_back([file, levels] { return orNull(PressureTriggers::onFile(file, levels)); });
  }
  for (const std::string& file : places.pressureFiles) {
    ways.emplace_back([file, levels, &clock] { return PolledStallTotals::on(file, levels, clock.now()); });
  }
  ways.emplace_back([places, levels] { return PolledAvailableMemory::on(places.memoryInfo, levels); });
  return ways;
}

class WatchedPressure final : public MemoryPressureEvents {
 public:
  WatchedPressure(std::vector<MakeSensor> ways, const Clock& clock, PressureWait wait)
      : ways_(std::move(ways)),
        clock_(clock),
        wait_(std::move(wait)),
        ending_(::eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK)) {}

  ~WatchedPressure() override {
    if (!thread_.joinable()) return;
    ::eventfd_write(ending_.number(), 1);
    thread_.join();
  }
  WatchedPressure(const WatchedPressure&) = delete;
  WatchedPressure& operator=(const WatchedPressure&) = delete;

  void setHandler(std::function<void()> handler) override { handler_ = std::move(handler); }

  void resume() override {
    if (thread_.joinable() || !handler_ || !ending_) return;
    try {
      thread_ = std::thread([this] { watch(); });
    } catch (const std::system_error&) {
      // No thread to be had: there are no warnings.
    }
  }

 private:
  enum class End { ofSensor, ofSubscription };

  void watch() const {
    for (const MakeSensor& makeSensor : ways_) {
      const std::unique_ptr<PressureSensor> sensor = makeSensor();
      if (sensor != nullptr && watchWith(*sensor) == End::ofSubscription) return;
    }
  }

  End watchWith(PressureSensor& sensor) const {
    const std::span<const pollfd> awaited = sensor.awaited();
    std::vector<pollfd> files(awaited.begin(), awaited.end());
    files.push_back({ending_.number(), POLLIN, 0});
    const std::span<const pollfd> asked(files.data(), awaited.size());
    const int limit = sensor.interval() ? static_cast<int>(sensor.interval()->count()) : -1;
    while (true) {
      if (wait_(files.data(), files.size(), limit) < 0) {
        if (errno == EINTR) continue;
        return End::ofSensor;
      }
      if (files.back().revents != 0) return End::ofSubscription;
      const PressureVerdict verdict = sensor.judge(asked, clock_.now());
      if (verdict == PressureVerdict::gone) return End::ofSensor;
      if (verdict == PressureVerdict::pressure) handler_();
    }
  }

  std::vector<MakeSensor> ways_;
  const Clock& clock_;
  PressureWait wait_;
  FileDescriptor ending_;  // readable when the thread is to end
  std::function<void()> handler_;
  std::thread thread_;
};

}  // namespace

MemoryPressurePlaces MemoryPressurePlaces::ofProcess(const Environment& environment,
                                                     const std::vector<std::string>& hierarchies) {
  MemoryPressurePlaces places;
  const std::string watch = valueOf(environment, "MEMORY_PRESSURE_WATCH").value_or("");
  const std::optional<std::string> text =
      base64Decoded(valueOf(environment, "MEMORY_PRESSURE_WRITE").value_or(""));
  places.isOff = watch == kNoWatch;
  if (watch.starts_with('/') && text) {
    places.watch = watch;
    places.watchText = *text;
  }
  // The root group's file would say the same as the system's.
  if (const std::optional<std::string> group = ownControlGroup(); group && *group != "/") {
    for (const std::string& hierarchy : hierarchies) {
      places.pressureFiles.push_back(hierarchy + *group + kPressureFileName);
    }
  }
  places.pressureFiles.emplace_back(kSystemPressure);
  return places;
}

std::unique_ptr<MemoryPressureEvents> KernelMemoryPressureSource::create(MemoryPressureLevels levels) {
  return std::make_unique<WatchedPressure>(waysTo(places_, levels, clock_), clock_, wait_);
}

}  // namespace norvex
