#include <gmock/gmock.h>

#include "tests/agent/AgentWorld.h"

namespace norvex {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::SizeIs;

TEST(StartUp, PreparesTheProcessThenRegistersThenServesTheLoop) {
  AgentWorld world;
  EXPECT_EQ(world.start(), "waits");
  EXPECT_THAT(world.calls.all(), ElementsAre("allowSuddenTermination", "throttleDiskIO",
                                             "registerActivity com.brixo.NorvexAgent", "runLoop"));
}

TEST(StartUp, PreparesTheProcessBeforeAForcedRun) {
  AgentWorld world;
  EXPECT_EQ(world.start({"--force"}), "returns 0");
  const std::vector<std::string> calls = world.calls.all();
  ASSERT_GT(calls.size(), 3U);
  EXPECT_EQ(calls[0], "allowSuddenTermination");
  EXPECT_EQ(calls[1], "throttleDiskIO");
}

TEST(StartUp, IsForcedByOneExactArgumentAtAnyPosition) {
  const struct {
    std::vector<std::string> arguments;
    bool isForced;
  } rows[] = {
      {{"--force"}, true},
      {{"--quiet", "--force"}, true},
      {{"--force", "x", "y"}, true},
      {{"a", "b", "--force", "c"}, true},
      {{"--force", "--force"}, true},
      {{}, false},
      {{""}, false},
      {{"--Force"}, false},
      {{"--FORCE"}, false},
      {{"-force"}, false},
      {{"force"}, false},
      {{"--force=1"}, false},
      {{"--force "}, false},
      {{" --force"}, false},
      {{"--forced"}, false},
      {{"--forc"}, false},
      {{"-", "--", "f"}, false},
  };
  for (const auto& row : rows) {
    AgentWorld world;
    EXPECT_EQ(world.start(row.arguments), row.isForced ? "returns 0" : "waits")
        << ::testing::PrintToString(row.arguments);
    EXPECT_THAT(world.activityScheduler.registrations, SizeIs(row.isForced ? 0 : 1));
    EXPECT_EQ(world.diagnosticLog.messages.empty(), !row.isForced);
  }
}

TEST(StartUp, DoesNotTakeTheProgramsNameForAnArgument) {
  AgentWorld world;
  world.processControl.commandLine = {"--force"};
  EXPECT_THROW(norvex::main(), LoopIsParked);
  EXPECT_THAT(world.diagnosticLog.messages, IsEmpty());
}

TEST(StartUp, SurvivesACommandLineWithoutAName) {
  AgentWorld world;
  world.processControl.commandLine = {};
  EXPECT_THROW(norvex::main(), LoopIsParked);
}

TEST(StartUp, RegistersItsHandlerUnderItsLabelForTheCheckIn) {
  AgentWorld world;
  world.storeVersion(4);
  world.start();
  ASSERT_THAT(world.activityScheduler.registrations, SizeIs(1));
  EXPECT_EQ(world.activityScheduler.registrations[0].identifier, "com.brixo.NorvexAgent");
  EXPECT_EQ(world.activityScheduler.registrations[0].criteria, ActivityCriteria::checkIn);
  InMemoryActivity activity(world.calls, ActivityState::run);
  EXPECT_THROW(world.activityScheduler.deliver(activity), ProcessExited);
  EXPECT_THAT(world.jobRegistry.disabledJobs, ElementsAre("com.brixo.NorvexAgent"));
}

TEST(StartUp, RunsTheLoopAgainEachTimeItReturns) {
  AgentWorld world;
  int runs = 0;
  world.eventLoops.loop.whenRun = [&] {
    if (++runs == 5) throw LoopIsParked();
  };
  EXPECT_EQ(world.start(), "waits");
  EXPECT_EQ(runs, 5);
  EXPECT_THAT(world.activityScheduler.registrations, SizeIs(1));
}

TEST(StartUp, EndsWhenTheHandlerEndsTheProcess) {
  AgentWorld world;
  world.storeVersion(4);
  world.eventLoops.loop.whenRun = [&] {
    InMemoryActivity checkIn(world.calls, ActivityState::checkIn);
    world.activityScheduler.deliver(checkIn);
    InMemoryActivity activity(world.calls, ActivityState::run);
    world.activityScheduler.deliver(activity);
  };
  EXPECT_EQ(world.start(), "exit 0");
}

TEST(ForcedRun, LeavesSchedulerGateWatchdogAndJobAlone) {
  for (const ScanOutcome outcome : {ScanOutcome::record, ScanOutcome::nothing}) {
    AgentWorld world(outcome);
    EXPECT_EQ(world.start({"--force"}), "returns 0");
    EXPECT_THAT(world.calls.of({"registerActivity", "runLoop", "copyValue", "createMemoryPressure",
                                "ownProcess", "disableJob", "setState", "exit"}),
                IsEmpty());
    EXPECT_THAT(world.systemLog.lines, IsEmpty());
  }
}

TEST(ForcedRun, ReportsAndRecordsEachTime) {
  AgentWorld world;
  world.storeVersion(4);
  EXPECT_EQ(world.start({"--force"}), "returns 0");
  EXPECT_THAT(world.diagnosticLog.messages, SizeIs(2));
  EXPECT_EQ(world.start({"--force"}), "returns 0");
  EXPECT_THAT(world.diagnosticLog.messages, SizeIs(4));
  EXPECT_EQ(world.storedVersion(), 4);
  EXPECT_THAT(world.calls.of({"setValue"}),
              ElementsAre("setValue LastVersionRun=4", "setValue LastVersionRun=4"));
}

TEST(ForcedRun, RecordsThisReleaseOverALaterOne) {
  AgentWorld world;
  world.storeVersion(5);
  world.start({"--force"});
  EXPECT_EQ(world.storedVersion(), 4);
}

TEST(ForcedRun, RecordsNothingWhenTheScanGaveNothing) {
  AgentWorld world(ScanOutcome::nothing);
  EXPECT_EQ(world.start({"--force"}), "returns 0");
  EXPECT_THAT(world.diagnosticLog.messages, IsEmpty());
  EXPECT_EQ(world.storedVersion(), std::nullopt);
  EXPECT_THAT(world.calls.of({"setValue", "synchronize", "disallowSuddenTermination"}), IsEmpty());
}

}  // namespace
}  // namespace norvex
