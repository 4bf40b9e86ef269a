#include "tests/support/InMemoryEventLoop.h"

#include <utility>

namespace norvex {

void InMemoryEventLoop::postAfter(Clock::Moment::duration delay, Input input) {
  delayed_.emplace(clock_.now() + delay, std::move(input));
}

bool InMemoryEventLoop::runOnce(Clock::Moment deadline) {
  passes.push_back({clock_.now(), deadline});
  if (isStuck) {
    clock_.advanceTo(deadline);
    return false;
  }
  if (inputs_.empty() && delayed_.empty()) throw NothingToWaitFor();
  if (inputs_.empty() && delayed_.begin()->first <= deadline) {
    clock_.advanceTo(delayed_.begin()->first);
    inputs_.push_back(std::move(delayed_.extract(delayed_.begin()).mapped()));
  }
  if (inputs_.empty()) {
    clock_.advanceTo(deadline);
    return false;
  }
  const Input input = std::move(inputs_.front());
  inputs_.pop_front();
  input();
  return true;
}

void InMemoryEventLoop::run() {
  calls_.add("runLoop");
  whenRun();
}

}  // namespace norvex
