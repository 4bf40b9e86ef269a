// The time that passes. The core asks it for elapsed times and deadlines; tests move it by hand.
//
// Called from any thread.
#pragma once

#include <chrono>

namespace norvex {

class Clock {
 public:
  using Moment = std::chrono::steady_clock::time_point;

  virtual ~Clock() = default;

  // The present moment of a clock that never goes back. Cannot fail.
  virtual Moment now() const = 0;
};

}  // namespace norvex
