// A service manager that knows the agent's job, and what was asked of it.
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "tool/AgentJob.h"

namespace norvex {

class InMemoryAgentJob final : public AgentJob {
 public:
  Result<AgentJobState> state() override {
    if (failure) return *failure;
    return content;
  }
  Result<void> enable() override { return carryOut("enable", true); }
  Result<void> disable() override { return carryOut("disable", false); }
  Result<Started> run() override {
    calls.emplace_back("run");
    if (failure) return *failure;
    return started;
  }

  AgentJobState content = switchedOn();
  Started started = Started::yes;
  std::optional<Error> failure;  // of everything
  std::vector<std::string> calls;

 private:
  static AgentJobState switchedOn() {
    AgentJobState state;
    state.isEnabled = true;
    return state;
  }

  Result<void> carryOut(const char* call, bool isEnabled) {
    calls.emplace_back(call);
    if (failure) return *failure;
    content.isEnabled = isEnabled;
    return {};
  }
};

}  // namespace norvex
