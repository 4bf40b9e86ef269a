// Event loops for tests with real threads: one a thread, inputs only, no time. The thread that makes this
// object is the main thread.
//
// A pass waits for an input however long that takes: the clock of a test stands still, so its deadline never
// comes.
#pragma once

#include <condition_variable>
#include <deque>
#include <map>
#include <mutex>
#include <thread>

#include "platform/EventLoop.h"

namespace norvex {

class ThreadedEventLoops final : public EventLoops {
 public:
  ThreadedEventLoops() : main_(current()) {}

  EventLoop& current() override;
  EventLoop& main() override { return main_; }

 private:
  class Loop final : public EventLoop {
   public:
    void post(Input input) override;
    bool runOnce(Clock::Moment deadline) override;
    void run() override;

   private:
    std::mutex mutex_;
    std::condition_variable posted_;
    std::deque<Input> inputs_;
  };

  std::mutex mutex_;
  std::map<std::thread::id, Loop> loops_;
  EventLoop& main_;
};

}  // namespace norvex
