// The event loops of the process: one for the main thread, one for any other thread that asks for it.
#pragma once

#include <thread>

#include "platform/EventLoop.h"
#include "platform/linux/ThreadEventLoop.h"

namespace norvex {

class ThreadEventLoops final : public EventLoops {
 public:
  // The constructing thread becomes the main thread. The main loop lives as long as this object, which the
  // program keeps for as long as any of its threads may post.
  ThreadEventLoops() = default;

  EventLoop& current() override;
  EventLoop& main() override { return mainLoop_; }

 private:
  const std::thread::id mainThread_ = std::this_thread::get_id();
  ThreadEventLoop mainLoop_;
};

}  // namespace norvex
