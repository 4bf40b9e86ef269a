// A source of memory-pressure events that never has one: the kernel's pressure triggers are not listened to
// yet.
//
// With it the memory watchdog can be installed, but never wakes up.
#pragma once

#include "platform/MemoryPressureSource.h"

namespace norvex {

class SilentMemoryPressureSource final : public MemoryPressureSource {
 public:
  std::unique_ptr<MemoryPressureEvents> create(MemoryPressureLevels levels) override;
};

}  // namespace norvex
