// The agent's job in systemd's user manager.
#pragma once

#include <string>

#include "platform/linux/Environment.h"
#include "tool/AgentJob.h"

namespace norvex {

class SystemdAgentJob final : public AgentJob {
 public:
  // `environment` is that of the process: it names the bus. Connects anew for each question.
  explicit SystemdAgentJob(Environment environment) : environment_(std::move(environment)) {}

  Result<AgentJobState> state() override;
  Result<void> enable() override;
  Result<void> disable() override;
  Result<Started> run() override;

 private:
  Environment environment_;
};

}  // namespace norvex
