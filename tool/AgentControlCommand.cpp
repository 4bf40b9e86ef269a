#include "tool/AgentControlCommand.h"

#include <string>

#include "agent/AgentIdentity.h"
#include "tool/AgentSwitch.h"
#include "tool/Faults.h"
#include "tool/JsonText.h"

namespace norvex {
namespace {

ExitStatus end(ToolWorld& world, bool json, const std::string& outcome, const std::string& sentence,
               const Faults& faults) {
  if (json) {
    world.out.stream() << jsonPage(
        {{"version", kJsonVersion}, {"outcome", outcome}, {"errors", faults.asJson()}});
  } else if (!sentence.empty()) {
    world.out.stream() << sentence << '\n';
  }
  return faults.status();
}

void addFailure(Faults& faults, const Error& error) {
  faults.add(agentLabel, "failed", error.description + jobRemedy(error));
}

}  // namespace

ExitStatus runAgentRun(ToolWorld& world, const AgentRunRequest& request) {
  Faults faults(world.err);
  const char* const kSeeStatus = "; see how it went with: norvexctl agent status";
  const auto started = world.agentJob.run();
  if (!started) {
    if (world.wakeWaitingAgent()) {
      return end(world, request.json, "woken",
                 std::string("The agent that was waiting has got the word to run") + kSeeStatus, faults);
    }
    addFailure(faults, started.error());
    return end(world, request.json, "failed", "", faults);
  }
  switch (started.value()) {
    case AgentJob::Started::yes:
      return end(world, request.json, "started", std::string("Started") + kSeeStatus, faults);
    case AgentJob::Started::wasRunning:
      return end(world, request.json, "running", "The agent is running already.", faults);
    case AgentJob::Started::conditionsNotMet:
      break;
  }
  faults.add(
      agentLabel, "conditionsNotMet",
      "not started: the job's conditions are not met (on battery, other programs wait for memory, disk or "
      "processor, or reporting is switched off); see: norvexctl agent status");
  return end(world, request.json, "conditionsNotMet", "", faults);
}

ExitStatus runAgentEnable(ToolWorld& world, const AgentEnableRequest& request) {
  Faults faults(world.err);
  if (const auto enabled = world.agentJob.enable(); !enabled) {
    addFailure(faults, enabled.error());
    return end(world, request.json, "failed", "", faults);
  }
  std::string sentence = "The agent's job is on for you.";
  if (const auto state = world.agentJob.state()) {
    const AgentSwitch agentSwitch = agentSwitchOf(world, state.value());
    if (!agentSwitch.isOn) sentence += " It does not run all the same: " + agentSwitch.explanation;
    if (agentSwitch.isOn && thisReleaseHasReported())
      sentence += " This release has reported: at its next start it switches itself off again.";
  }
  return end(world, request.json, "enabled", sentence, faults);
}

ExitStatus runAgentDisable(ToolWorld& world, const AgentDisableRequest& request) {
  Faults faults(world.err);
  if (const auto disabled = world.agentJob.disable(); !disabled) {
    addFailure(faults, disabled.error());
    return end(world, request.json, "failed", "", faults);
  }
  return end(world, request.json, "disabled",
             "The agent's job is off for you until this release is replaced; to be left out for good, set "
             "DO_NOT_TRACK=1 in ~/.config/environment.d/norvex.conf.",
             faults);
}

}  // namespace norvex
