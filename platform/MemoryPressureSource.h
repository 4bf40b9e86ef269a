// The system's warnings that memory is running short.
//
// Made and started on the thread of the run; the handler is called on a background thread of the source's
// own.
#pragma once

#include <functional>
#include <memory>

namespace norvex {

// Levels that can be asked for together.
struct MemoryPressureLevels {
  bool warning = false;
  bool critical = false;
};

// One subscription. Made suspended; ends with the object.
class MemoryPressureEvents {
 public:
  virtual ~MemoryPressureEvents() = default;

  // To be called before resume().
  virtual void setHandler(std::function<void()> handler) = 0;

  // Starts the delivery: from now on the handler is called each time the pressure reaches one of the levels.
  virtual void resume() = 0;
};

class MemoryPressureSource {
 public:
  virtual ~MemoryPressureSource() = default;

  // Cannot fail: where the system gives no warnings, the source stays silent.
  virtual std::unique_ptr<MemoryPressureEvents> create(MemoryPressureLevels levels) = 0;
};

}  // namespace norvex
