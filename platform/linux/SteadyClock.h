// The kernel's monotonic clock.
#pragma once

#include "platform/Clock.h"

namespace norvex {

class SteadyClock final : public Clock {
 public:
  Moment now() const override;
};

}  // namespace norvex
