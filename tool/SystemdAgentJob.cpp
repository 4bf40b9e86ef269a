#include "tool/SystemdAgentJob.h"

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <filesystem>
#include <vector>

#include "agent/AgentIdentity.h"
#include "platform/linux/TimedJob.h"
#include "platform/linux/UserManager.h"

namespace norvex {
namespace {

// Where masks for every user are.
constexpr const char* kUnitsOfAdministrator = "/etc/systemd/user/";
constexpr const char* kMaskTarget = "/dev/null";
constexpr std::string_view kDoNotTrack = "DO_NOT_TRACK=";

using Moment = std::chrono::system_clock::time_point;

// A bus that is not there is not to be taken for a job that is not.
Result<UserManager> reach(const Environment& environment) {
  auto manager = UserManager::connect(environment);
  if (manager || manager.error().code != ENOENT) return manager;
  return Error{ENOMEDIUM, manager.error().description};
}

std::optional<std::int64_t> secondsOf(const std::optional<Moment>& moment) {
  if (!moment) return std::nullopt;
  return std::chrono::duration_cast<std::chrono::seconds>(moment->time_since_epoch()).count();
}

bool isMaskedForAll(const std::string& unit) {
  std::error_code error;  // no link
  return std::filesystem::read_symlink(kUnitsOfAdministrator + unit, error) == kMaskTarget && !error;
}

Result<void> addTrigger(UserManager& manager, const std::string& trigger, AgentJobState& state) {
  state.isMaskedForAll = state.isMaskedForAll || isMaskedForAll(trigger);
  const auto status = manager.status(trigger);
  if (!status) return status.error();
  if (status.value().activeState != "active") return {};
  const auto moments = manager.momentsOf(trigger);
  if (!moments) return moments.error();
  const auto next = secondsOf(moments.value().next);
  if (next && (!state.nextRun || *next < *state.nextRun)) state.nextRun = next;
  return {};
}

Result<void> addLastRun(UserManager& manager, const std::string& service, AgentJobState& state) {
  const auto run = manager.lastRun(service);
  if (!run) return run.error();
  state.lastStart = secondsOf(run.value().started);
  state.lastEnd = secondsOf(run.value().ended);
  state.isRunning = run.value().process != 0;
  state.lastResult = run.value().result;
  return {};
}

Result<AgentJobState> stateOf(UserManager& manager) {
  TimedJob job(manager, agentLabel);
  AgentJobState state;
  const auto triggers = job.triggers();
  if (!triggers) return triggers.error();
  for (const std::string& trigger : triggers.value()) {
    if (auto added = addTrigger(manager, trigger, state); !added) return added.error();
  }
  const auto isEnabled = job.isEnabled();
  if (!isEnabled) return isEnabled.error();
  state.isEnabled = isEnabled.value();
  const auto environment = manager.environment();
  if (!environment) return environment.error();
  state.doNotTrack = std::any_of(environment.value().begin(), environment.value().end(),
                                 [](const std::string& text) { return text.starts_with(kDoNotTrack); });
  if (auto added = addLastRun(manager, job.service(), state); !added) return added.error();
  return state;
}

}  // namespace

Result<AgentJobState> SystemdAgentJob::state() {
  auto manager = reach(environment_);
  if (!manager) return manager.error();
  return stateOf(manager.value());
}

Result<void> SystemdAgentJob::enable() {
  auto manager = reach(environment_);
  if (!manager) return manager.error();
  return TimedJob(manager.value(), agentLabel).enable();
}

Result<void> SystemdAgentJob::disable() {
  auto manager = reach(environment_);
  if (!manager) return manager.error();
  return TimedJob(manager.value(), agentLabel).disable();
}

Result<AgentJob::Started> SystemdAgentJob::run() {
  auto manager = reach(environment_);
  if (!manager) return manager.error();
  const std::string service = TimedJob(manager.value(), agentLabel).service();
  const auto before = manager.value().lastRun(service);
  if (!before) return before.error();
  if (before.value().process != 0) return Started::wasRunning;
  const auto ordered = manager.value().startAndWait(service);
  // Still at work after the limit: started it is.
  if (!ordered && ordered.error().code == ETIMEDOUT) return Started::yes;
  if (!ordered) return ordered.error();
  const auto after = manager.value().lastRun(service);
  if (!after) return after.error();
  return after.value().started == before.value().started ? Started::conditionsNotMet : Started::yes;
}

}  // namespace norvex
