// The agent's job in the user's service manager: how it stands, and what people can do with it.
//
// Asked by the commands, on the main thread.
#pragma once

#include <cstdint>
#include <optional>
#include <string>

#include "platform/Result.h"

namespace norvex {

struct AgentJobState {
  bool isEnabled = false;       // something that starts the agent is switched on
  bool isMaskedForAll = false;  // the administrator has masked it for every user
  bool doNotTrack = false;      // DO_NOT_TRACK is set where the manager would pass it on
  bool isRunning = false;
  // Seconds since 1970. What the manager has forgotten - it does at a log-out - is absent.
  std::optional<std::int64_t> nextRun, lastStart, lastEnd;
  std::string lastResult;  // "success", "exit-code", "signal", ...; of the run that lastStart tells of
};

class AgentJob {
 public:
  enum class Started { yes, wasRunning, conditionsNotMet };

  virtual ~AgentJob() = default;

  // Failures: ENOENT where the job is not installed, else what the way to the manager says.
  virtual Result<AgentJobState> state() = 0;

  // For this user, now and after a restart.
  virtual Result<void> enable() = 0;
  virtual Result<void> disable() = 0;

  // Starts the agent and returns when it has ended, or is still at work after a few seconds. The job's own
  // conditions hold for it as for any other start.
  virtual Result<Started> run() = 0;
};

}  // namespace norvex
