// The service manager's register of background jobs.
//
// Called at the end of a run on the scheduler's queue, and by the memory watchdog on a thread of its own.
#pragma once

#include <string>

#include "platform/Result.h"

namespace norvex {

enum class JobDomain {
  // The jobs of the user who runs the process; other users keep theirs.
  user,
};

class JobRegistry {
 public:
  virtual ~JobRegistry() = default;

  // Switches the job `label` off, so that it is not started again, also after a restart, until it is switched
  // on from outside. A job that is already off is a success. On failure the error says why; the job is then
  // as it was or, where only the last steps have failed, off from the next log-in on. A run of the job that
  // is under way goes on.
  virtual Result<void> disableJob(JobDomain domain, const std::string& label) = 0;
};

}  // namespace norvex
