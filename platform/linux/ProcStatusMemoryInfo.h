// The process's memory as the kernel states it in the process's status file.
#pragma once

#include <string>
#include <utility>

#include "platform/ProcessMemoryInfo.h"

namespace norvex {

class ProcStatusMemoryInfo final : public ProcessMemoryInfo {
 public:
  explicit ProcStatusMemoryInfo(std::string statusPath = "/proc/self/status")
      : statusPath_(std::move(statusPath)) {}

  // internal = RssAnon, compressed = VmSwap. Fails when the file cannot be read (its errno value), when one
  // of the two lines is missing or says something else than a number of kB (ENODATA), and when a number does
  // not fit (EOVERFLOW).
  Result<MemoryUse> ownProcess() override;

 private:
  std::string statusPath_;
};

}  // namespace norvex
