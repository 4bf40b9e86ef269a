#include "tests/support/ThreadedEventLoops.h"

#include <utility>

namespace norvex {

EventLoop& ThreadedEventLoops::current() {
  const std::lock_guard lock(mutex_);
  return loops_[std::this_thread::get_id()];
}

void ThreadedEventLoops::Loop::post(Input input) {
  const std::lock_guard lock(mutex_);
  inputs_.push_back(std::move(input));
  posted_.notify_one();
}

bool ThreadedEventLoops::Loop::runOnce(Clock::Moment) {
  std::unique_lock lock(mutex_);
  posted_.wait(lock, [&] { return !inputs_.empty(); });
  const Input input = std::move(inputs_.front());
  inputs_.pop_front();
  lock.unlock();
  input();
  return true;
}

void ThreadedEventLoops::Loop::run() {
  runOnce(Clock::Moment::max());
}

}  // namespace norvex
