// A machine in memory whose every kind of content is there, for the commands that measure, and a companion
// command whose output is kept.
#pragma once

#include <atomic>
#include <cstdint>
#include <sstream>
#include <string>

#include "InMemoryAgentJob.h"
#include "InMemoryAgentJournal.h"
#include "index/StoreFolder.h"
#include "platform/linux/LocaleByteCountFormatter.h"
#include "tests/scanner/ScanWorld.h"
#include "tests/support/TreeOnDisk.h"
#include "tool/ToolWorld.h"

namespace norvex {

class MeasuredWorld : public ScanWorld {
 public:
  static constexpr std::int64_t kNow = 1'700'000'000;  // 2023-11-14 22:13:20 UTC

  // Two volumes: "/", half a terabyte, and "/media/disk", a quarter of one. `style` is of both outputs.
  explicit MeasuredWorld(const ConsoleStyle& style = {});

  std::string output() const { return outText_.str(); }
  std::string errors() const { return errText_.str(); }

  // A folder of the test's own.
  const ondisk::TreeOnDisk& folder() const { return cache_; }

 private:
  void fillStartupDisk();
  void fillOtherDisk();

  ondisk::TreeOnDisk cache_;
  StoreFolder stores_{cache_.path()};
  std::ostringstream outText_, errText_;
  Console out_, err_;
  const LocaleByteCountFormatter byteCounts_{"C"};
  std::atomic<bool> cancelled_{false};

 public:
  InMemoryAgentJournal journal;
  InMemoryAgentJob job;
  bool agentWaits = false;  // for the word to run
  ToolWorld world;
};

}  // namespace norvex
