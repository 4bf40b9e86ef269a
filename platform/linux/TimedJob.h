// A job of the user: a service, and the units that start it. What it means to switch such a job on and off.
//
// Used by the JobRegistry role, and by the companion command for people. On one thread at a time; the manager
// outlives it.
#pragma once

#include <string>
#include <vector>

#include "platform/Result.h"
#include "platform/linux/UserManager.h"

namespace norvex {

class TimedJob {
 public:
  // The service is `label`.service. Its own timers are named `label`.timer or `label`.<anything>.timer.
  TimedJob(UserManager& manager, std::string label) : manager_(manager), label_(std::move(label)) {}

  std::string service() const { return label_ + ".service"; }

  // Every unit that starts the service or would, were it started or not masked: the job's own timers and
  // whatever else the manager says that triggers it. In the order of their names. ENOENT when there is no
  // such service or nothing that starts it.
  Result<std::vector<std::string>> triggers();

  // True when a trigger is enabled. Failures as of triggers().
  Result<bool> isEnabled();

  // Switches every trigger off, now and after a restart, also those that are enabled for all users, and makes
  // sure of it. A run of the service that is under way goes on. A job that is off already is a success. On
  // failure some steps may have been taken: a job that was masked and could not be stopped is off from the
  // next log-in on.
  Result<void> disable();

  // Takes masks away, enables the triggers that are then not enabled, and starts them.
  Result<void> enable();

 private:
  Result<std::vector<std::string>> ownTimers();

  UserManager& manager_;
  std::string label_;
};

}  // namespace norvex
