// A queue of inputs with a lock and a condition: the event loop of one thread.
#pragma once

#include <condition_variable>
#include <deque>
#include <mutex>

#include "platform/EventLoop.h"

namespace norvex {

class ThreadEventLoop final : public EventLoop {
 public:
  void post(Input input) override;

  // An input may run the loop in turn; the inputs behind it then run inside it.
  bool runOnce(Clock::Moment deadline) override;

  // Waits for an input, runs inputs until none is waiting, and returns.
  void run() override;

 private:
  std::mutex mutex_;
  std::condition_variable arrived_;
  std::deque<Input> waiting_;
};

}  // namespace norvex
