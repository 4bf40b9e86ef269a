#include "platform/linux/ThreadEventLoop.h"

#include <utility>

namespace norvex {

void ThreadEventLoop::post(Input input) {
  // Notified under the lock: the input may be the last thing that the loop's thread waits for, and the loop
  // is gone with its thread as soon as the lock is free.
  const std::lock_guard lock(mutex_);
  waiting_.push_back(std::move(input));
  arrived_.notify_one();
}

bool ThreadEventLoop::runOnce(Clock::Moment deadline) {
  Input input;
  {
    std::unique_lock lock(mutex_);
    if (!arrived_.wait_until(lock, deadline, [this] { return !waiting_.empty(); })) return false;
    input = std::move(waiting_.front());
    waiting_.pop_front();
  }
  input();
  return true;
}

void ThreadEventLoop::run() {
  if (!runOnce(Clock::Moment::max())) return;
  while (runOnce(Clock::Moment::min())) {
  }
}

}  // namespace norvex
