// One way of learning that memory is short. The source's thread waits as the sensor says and then asks it.
//
// Made on any thread, then used on the source's thread alone.
#pragma once

#include <poll.h>

#include <chrono>
#include <optional>
#include <span>

#include "platform/Clock.h"

namespace norvex {

enum class PressureVerdict {
  calm,
  pressure,
  // The sensor has come to its end, its control group being gone for example. It is not asked again.
  gone,
};

class PressureSensor {
 public:
  virtual ~PressureSensor() = default;

  // What is to be waited for, as of poll(2). Stays the same, and valid, as long as the object.
  virtual std::span<const pollfd> awaited() const = 0;

  // How long to wait at most; absent when the descriptors say everything.
  virtual std::optional<std::chrono::milliseconds> interval() const = 0;

  // To be asked after the wait: `awaited` with what poll(2) has said about them, and the present moment.
  virtual PressureVerdict judge(std::span<const pollfd> awaited, Clock::Moment now) = 0;
};

}  // namespace norvex
