// From what was asked for to the command that does it.
#pragma once

#include <variant>

#include "tool/CommandLine.h"

namespace norvex {

struct CommandRunner {
  ToolWorld& world;

  ExitStatus operator()(const IndexUpdateRequest& request) const { return runIndexUpdate(world, request); }
  ExitStatus operator()(const IndexStatusRequest& request) const { return runIndexStatus(world, request); }
  ExitStatus operator()(const IndexQueryRequest& request) const { return runIndexQuery(world, request); }
  ExitStatus operator()(const IndexShowRequest& request) const { return runIndexShow(world, request); }
  ExitStatus operator()(const AgentStatusRequest& request) const { return runAgentStatus(world, request); }
  ExitStatus operator()(const AgentRunRequest& request) const { return runAgentRun(world, request); }
  ExitStatus operator()(const AgentEnableRequest& request) const { return runAgentEnable(world, request); }
  ExitStatus operator()(const AgentDisableRequest& request) const { return runAgentDisable(world, request); }
  ExitStatus operator()(const DoctorRequest& request) const {
    return runDoctor(world, request, DoctorPlaces::ofThisMachine());
  }
  ExitStatus operator()(const LogRequest& request) const { return runLog(world, request); }
  ExitStatus operator()(const PreviewRequest& request) const { return runPreview(world, request); }
  ExitStatus operator()(const ShowRequest& request) const { return runShow(world, request); }
  ExitStatus operator()(const SummaryRequest& request) const { return runSummary(world, request); }
};

inline ExitStatus runCommand(ToolWorld& world, const CommandRequest& request) {
  return std::visit(CommandRunner{world}, request);
}

}  // namespace norvex
