// The clock of a test: stands still until it is moved.
#pragma once

#include <atomic>

#include "platform/Clock.h"

namespace norvex {

class InMemoryClock final : public Clock {
 public:
  Moment now() const override { return Moment(Moment::duration(ticks_.fetch_add(driftPerReading.load()))); }

  // How far each reading moves it; a clock that is out of order may go back.
  std::atomic<Moment::duration::rep> driftPerReading{0};

  void advance(Moment::duration step) { ticks_ += step.count(); }

  // Never moves back: a moment that has passed changes nothing.
  void advanceTo(Moment moment) {
    if (moment > now()) ticks_ = moment.time_since_epoch().count();
  }

 private:
  // Not the epoch, so that a duration that is taken for a moment shows.
  mutable std::atomic<Moment::duration::rep> ticks_{Moment::duration(std::chrono::hours(1000)).count()};
};

}  // namespace norvex
