// The kernel's warnings that memory is running short, by the best way that this system offers.
//
// The ways, best first: where the service manager said (MEMORY_PRESSURE_WATCH), a trigger on the pressure
// file of the process's own control group, a trigger on the system's, the totals of either file polled, the
// available memory polled. When one comes to its end the next is taken.
#pragma once

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "platform/Clock.h"
#include "platform/MemoryPressureSource.h"
#include "platform/linux/Environment.h"
#include "platform/linux/PressureSensor.h"

namespace norvex {

// Where to look. A plain value.
struct MemoryPressurePlaces {
  std::string watch;      // empty: the service manager said nothing
  std::string watchText;  // what is to be written there
  bool isOff = false;     // the service manager said that there is to be no watch
  std::vector<std::string> pressureFiles;
  std::string memoryInfo = "/proc/meminfo";

  // As the process's environment and its control group say. A watch that is not an absolute path, or whose
  // text is not base64, counts as not said.
  static MemoryPressurePlaces ofProcess(const Environment& environment,
                                        const std::vector<std::string>& hierarchies = {
                                            "/sys/fs/cgroup", "/sys/fs/cgroup/unified"});
};

// As poll(2). A test that moves the time by hand brings its own.
using PressureWait = std::function<int(pollfd* files, nfds_t count, int milliseconds)>;

class KernelMemoryPressureSource final : public MemoryPressureSource {
 public:
  // `clock` outlives every subscription.
  KernelMemoryPressureSource(MemoryPressurePlaces places, const Clock& clock, PressureWait wait = ::poll)
      : places_(std::move(places)), clock_(clock), wait_(std::move(wait)) {}

  // A subscription whose handler is called on a thread of its own, at most about once in two seconds, for as
  // long as memory is short. It ends with the thread: the destructor waits for a handler that is being
  // called. Silent where no way leads to a warning, and where no thread is to be had.
  std::unique_ptr<MemoryPressureEvents> create(MemoryPressureLevels levels) override;

 private:
  MemoryPressurePlaces places_;
  const Clock& clock_;
  PressureWait wait_;
};

}  // namespace norvex
