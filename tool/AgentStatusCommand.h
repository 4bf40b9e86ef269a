// norvexctl agent status: whether this release has reported, whether it will, and why not.
#pragma once

#include "tool/ExitStatus.h"
#include "tool/ToolWorld.h"

namespace norvex {

struct AgentStatusRequest {
  bool json = false;
};

// Fails only when something that it tells of cannot be found out; the rest is told all the same.
ExitStatus runAgentStatus(ToolWorld& world, const AgentStatusRequest& request);

}  // namespace norvex
