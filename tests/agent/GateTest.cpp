#include <gmock/gmock.h>

#include <cerrno>

#include "tests/agent/AgentWorld.h"

namespace norvex {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::Not;

TEST(Gate, LeavesEveryStateButRunAlone) {
  for (const int state : {0, 1, 3, 4, 5, 6, -1, 100}) {
    AgentWorld world;
    EXPECT_EQ(world.deliver(static_cast<ActivityState>(state)), "waits") << state;
    EXPECT_THAT(world.calls.all(), IsEmpty()) << state;
  }
}

TEST(Gate, LetsTheReleaseReportOnce) {
  const struct {
    std::optional<double> stored;
    bool scans;
  } rows[] = {
      {std::nullopt, true}, {0, true},    {-1, true},   {3, true},  {3.999, true},
      {4, false},           {4.0, false}, {4.5, false}, {5, false}, {1e18, false},
  };
  for (const auto& row : rows) {
    AgentWorld world;
    if (row.stored) world.storeVersion(*row.stored);
    EXPECT_EQ(world.deliver(ActivityState::run), "exit 0");
    EXPECT_EQ(!world.diagnosticLog.messages.empty(), row.scans) << row.stored.value_or(-99);
    EXPECT_EQ(!world.calls.of({"createQuery"}).empty(), row.scans) << row.stored.value_or(-99);
    EXPECT_EQ(world.storedVersion(), row.scans ? std::optional<double>(4) : row.stored);
    EXPECT_THAT(world.jobRegistry.disabledJobs, ElementsAre(agentLabelText));
  }
}

TEST(Gate, OnlySwitchesTheJobOffWhenTheReleaseHasReported) {
  AgentWorld world;
  world.storeVersion(4);
  EXPECT_EQ(world.deliver(ActivityState::run), "exit 0");
  EXPECT_THAT(world.calls.all(),
              ElementsAre("copyValue LastVersionRun", "disableJob com.brixo.NorvexAgent",
                          "syslog 5 com.brixo.NorvexAgent disabled", "setState 5", "exit 0"));
}

TEST(Gate, ReadsAPendingVersionToo) {
  AgentWorld world;
  world.preferenceStore.setValue("LastVersionRun", 4, agentLabelText);
  world.deliver(ActivityState::run);
  EXPECT_THAT(world.diagnosticLog.messages, IsEmpty());
}

TEST(Gate, ReadsItsOwnDomainAndKeyAlone) {
  AgentWorld world;
  world.preferenceStore.stored["com.brixo.Other"]["LastVersionRun"] = 4;
  world.preferenceStore.stored[agentLabelText]["lastVersionRun"] = 4;
  world.deliver(ActivityState::run);
  EXPECT_THAT(world.diagnosticLog.messages, Not(IsEmpty()));
}

// --- the job switch-off

TEST(DisableAgentJob, LogsItsOutcome) {
  AgentWorld world;
  disableAgentJob();
  world.jobRegistry.failure = Error{5, "no 100%s manager"};
  disableAgentJob();
  EXPECT_THAT(world.systemLog.lines,
              ElementsAre("5 com.brixo.NorvexAgent disabled",
                          "3 Failed to disable com.brixo.NorvexAgent, error: no 100%s manager"));
  EXPECT_THAT(world.calls.of({"disableJob"}),
              ElementsAre("disableJob com.brixo.NorvexAgent", "disableJob com.brixo.NorvexAgent"));
}

TEST(DisableAgentJob, ThatFailsKeepsTheRunFromNothing) {
  for (const bool hasReported : {false, true}) {
    AgentWorld world;
    if (hasReported) world.storeVersion(4);
    world.jobRegistry.failure = systemError(EPERM);
    InMemoryActivity activity(world.calls, ActivityState::run);
    EXPECT_EQ(world.deliver(activity), "exit 0");
    EXPECT_THAT(activity.statesSet, ElementsAre(ActivityState::done));
    EXPECT_EQ(world.storedVersion(), 4);
    EXPECT_THAT(world.systemLog.lines,
                ElementsAre("3 Failed to disable com.brixo.NorvexAgent, error: Operation not permitted"));
  }
}

TEST(DisableAgentJob, IsTriedAgainAtTheNextStart) {
  AgentWorld world;
  world.jobRegistry.failure = systemError(EPERM);
  world.deliver(ActivityState::run);
  EXPECT_THAT(world.jobRegistry.disabledJobs, IsEmpty());
  world.jobRegistry.failure.reset();
  world.diagnosticLog.messages.clear();
  world.deliver(ActivityState::run);
  EXPECT_THAT(world.jobRegistry.disabledJobs, ElementsAre(agentLabelText));
  EXPECT_THAT(world.diagnosticLog.messages, IsEmpty());
}

}  // namespace
}  // namespace norvex
