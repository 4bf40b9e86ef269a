// norvexctl agent run, enable and disable: what people do with the agent's job.
#pragma once

#include "tool/ExitStatus.h"
#include "tool/ToolWorld.h"

namespace norvex {

struct AgentRunRequest {
  bool json = false;
};
struct AgentEnableRequest {
  bool json = false;
};
struct AgentDisableRequest {
  bool json = false;
};

// Starts the agent through the service manager, or wakes one that waits for the word. Fails when there is
// neither, and when the job's conditions are not met.
ExitStatus runAgentRun(ToolWorld& world, const AgentRunRequest& request);

// Switches the job on, or off, for this user. A job that is so already is a success.
ExitStatus runAgentEnable(ToolWorld& world, const AgentEnableRequest& request);
ExitStatus runAgentDisable(ToolWorld& world, const AgentDisableRequest& request);

}  // namespace norvex
