// The memory use that the test says the process has.
#pragma once

#include "platform/ProcessMemoryInfo.h"
#include "tests/support/CallJournal.h"

namespace norvex {

class InMemoryProcessMemoryInfo final : public ProcessMemoryInfo {
 public:
  explicit InMemoryProcessMemoryInfo(CallJournal& calls) : calls_(calls) {}

  Result<MemoryUse> ownProcess() override {
    calls_.add("ownProcess");
    return use;
  }

  Result<MemoryUse> use = MemoryUse{};

 private:
  CallJournal& calls_;
};

}  // namespace norvex
