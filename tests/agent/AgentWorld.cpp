#include "tests/agent/AgentWorld.h"

namespace norvex {

std::optional<double> AgentWorld::storedVersion() const {
  const auto domain = preferenceStore.stored.find(agentLabelText);
  if (domain == preferenceStore.stored.end() || !domain->second.contains("LastVersionRun"))
    return std::nullopt;
  return domain->second.at("LastVersionRun");
}

std::string AgentWorld::start(std::vector<std::string> arguments) {
  processControl.commandLine = {"NorvexAgent"};
  processControl.commandLine.insert(processControl.commandLine.end(), arguments.begin(), arguments.end());
  try {
    return "returns " + std::to_string(norvex::main());
  } catch (const LoopIsParked&) {
    return "waits";
  } catch (const ProcessExited& end) {
    return "exit " + std::to_string(end.status);
  }
}

std::string AgentWorld::deliver(InMemoryActivity& activity) {
  try {
    handleActivity(activity);
    return "waits";
  } catch (const ProcessExited& end) {
    return "exit " + std::to_string(end.status);
  }
}

std::string AgentWorld::deliver(ActivityState state) {
  InMemoryActivity activity(calls, state);
  return deliver(activity);
}

}  // namespace norvex
