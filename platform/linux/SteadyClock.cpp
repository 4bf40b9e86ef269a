#include "platform/linux/SteadyClock.h"

namespace norvex {

Clock::Moment SteadyClock::now() const {
  return std::chrono::steady_clock::now();
}

}  // namespace norvex
