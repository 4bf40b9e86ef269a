// A thread's queue of inputs and the means to wait for them.
//
// Inputs may be posted from any thread; running a loop is for the thread that owns it alone.
#pragma once

#include <functional>

#include "platform/Clock.h"

namespace norvex {

class EventLoop {
 public:
  using Input = std::function<void()>;

  virtual ~EventLoop() = default;

  // Queues an input behind those already waiting and wakes the loop. Inputs run one at a time, in the order
  // posted, on the loop's own thread. Cannot fail.
  virtual void post(Input input) = 0;

  // Runs one input, waiting for it until `deadline`. True when an input was run, false when the deadline came
  // first. A deadline that has passed still runs an input that is already waiting.
  virtual bool runOnce(Clock::Moment deadline) = 0;

  // Runs inputs as they come. May return when it has nothing to wait on; the caller runs it again.
  virtual void run() = 0;
};

// The loops of the process, one a thread.
class EventLoops {
 public:
  virtual ~EventLoops() = default;

  // The calling thread's own loop, made on first use. Valid until the thread ends.
  virtual EventLoop& current() = 0;

  // The main thread's loop, which carries the main task queue. Valid for the life of the process; any thread
  // may post to it.
  virtual EventLoop& main() = 0;
};

}  // namespace norvex
