// How much memory the process itself takes.
//
// Called on the thread that delivers memory-pressure events.
#pragma once

#include <cstdint>

#include "platform/Result.h"

namespace norvex {

// In bytes. File-backed memory is in neither.
struct MemoryUse {
  std::uint64_t internal = 0;    // private, anonymous memory that is resident
  std::uint64_t compressed = 0;  // the part of it that the system holds compressed or swapped out
};

class ProcessMemoryInfo {
 public:
  virtual ~ProcessMemoryInfo() = default;

  // The present use of the own process.
  virtual Result<MemoryUse> ownProcess() = 0;
};

}  // namespace norvex
