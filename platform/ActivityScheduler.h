// The system's scheduler of background activities, which decides when the agent may work.
//
// Registered with on the main thread; handlers are called on a queue thread of the scheduler's own.
#pragma once

#include <functional>
#include <string>

namespace norvex {

// The states of an activity that the agent knows by number; a scheduler may report others.
enum class ActivityState : int { checkIn = 0, run = 2, done = 5 };

// One activity of the scheduler's. Used only inside a handler call, on the thread that makes it.
class Activity {
 public:
  virtual ~Activity() = default;
  virtual ActivityState state() const = 0;
  virtual void setState(ActivityState state) = 0;
};

// What an activity waits for.
enum class ActivityCriteria {
  // No schedule of the caller's own: it takes over the activity that the definition of its job declares.
  checkIn,
};

class ActivityScheduler {
 public:
  using Handler = std::function<void(Activity&)>;

  virtual ~ActivityScheduler() = default;

  // From now on calls `handler` each time the activity `identifier` changes its state: first for the
  // check-in, then when it is to run. The handler is kept for the life of the process. Cannot fail towards
  // the caller: an activity that cannot be scheduled is simply never run.
  virtual void registerActivity(const std::string& identifier, ActivityCriteria criteria,
                                Handler handler) = 0;
};

}  // namespace norvex
