#include "platform/linux/ThreadEventLoops.h"

namespace norvex {

EventLoop& ThreadEventLoops::current() {
  if (std::this_thread::get_id() == mainThread_) return mainLoop_;
  thread_local ThreadEventLoop loop;
  return loop;
}

}  // namespace norvex
