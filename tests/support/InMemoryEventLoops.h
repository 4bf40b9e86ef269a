// The one loop of a test on one thread: the calling thread is the main thread.
#pragma once

#include "tests/support/InMemoryEventLoop.h"

namespace norvex {

class InMemoryEventLoops final : public EventLoops {
 public:
  InMemoryEventLoops(CallJournal& calls, InMemoryClock& clock) : loop(calls, clock) {}

  EventLoop& current() override { return loop; }
  EventLoop& main() override { return loop; }

  InMemoryEventLoop loop;
};

}  // namespace norvex
