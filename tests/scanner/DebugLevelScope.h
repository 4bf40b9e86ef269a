// Another debug level for the life of the object.
#pragma once

#include <cstdint>

#include "scanner/DebugLevel.h"

namespace norvex {

class DebugLevelScope {
 public:
  explicit DebugLevelScope(std::int64_t level) : previous_(debugLevel) { debugLevel = level; }
  ~DebugLevelScope() { debugLevel = previous_; }
  DebugLevelScope(const DebugLevelScope&) = delete;
  DebugLevelScope& operator=(const DebugLevelScope&) = delete;

 private:
  std::int64_t previous_;
};

}  // namespace norvex
