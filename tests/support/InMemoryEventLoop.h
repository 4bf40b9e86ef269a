// An event loop in simulated time: waiting moves the clock instead of the machine's.
//
// For tests on one thread.
#pragma once

#include <deque>
#include <functional>
#include <map>
#include <stdexcept>
#include <vector>

#include "platform/EventLoop.h"
#include "tests/support/CallJournal.h"
#include "tests/support/InMemoryClock.h"

namespace norvex {

// Thrown where a real loop would be waited on for ever.
struct NothingToWaitFor : std::runtime_error {
  NothingToWaitFor() : std::runtime_error("a loop is waited on that no input will ever reach") {}
};

// Thrown by run() when no test has said what happens while the loop runs: the process is waiting.
struct LoopIsParked {};

class InMemoryEventLoop final : public EventLoop {
 public:
  struct Pass {
    Clock::Moment begin;
    Clock::Moment deadline;
  };

  InMemoryEventLoop(CallJournal& calls, InMemoryClock& clock) : calls_(calls), clock_(clock) {}

  void post(Input input) override { inputs_.push_back(std::move(input)); }

  // Queues an input once that much time has passed.
  void postAfter(Clock::Moment::duration delay, Input input);

  // Moves the clock to the next delayed input's moment when nothing is queued, or to the deadline.
  bool runOnce(Clock::Moment deadline) override;

  // Calls `whenRun`, then returns as if there were nothing to wait on.
  void run() override;

  // Inputs stay where they are, whatever runs the loop.
  bool isStuck = false;
  // The passes that runOnce() made.
  std::vector<Pass> passes;
  std::function<void()> whenRun = [] { throw LoopIsParked(); };

 private:
  CallJournal& calls_;
  InMemoryClock& clock_;
  std::deque<Input> inputs_;
  std::multimap<Clock::Moment, Input> delayed_;
};

}  // namespace norvex
