#include <gmock/gmock.h>

#include "scanner/NVXScanner.h"
#include "tests/agent/AgentWorld.h"
#include "tests/scanner/DebugLevelScope.h"

namespace norvex {
namespace {

using std::chrono::milliseconds;
using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::SizeIs;

// Thrown in place of a process that is killed on the spot.
struct Killed {};

[[noreturn]] void kill() {
  throw Killed();
}

TEST(Run, ReportsBeforeItRecordsBeforeItSwitchesOffBeforeItIsDone) {
  AgentWorld world;
  EXPECT_EQ(world.deliver(ActivityState::run), "exit 0");
  EXPECT_THAT(world.calls.of({"copyValue", "createQuery", "disallowSuddenTermination", "logWithKeys",
                              "setValue", "synchronize", "disableJob", "syslog", "setState", "exit"}),
              ElementsAre("copyValue LastVersionRun", "createQuery", "createQuery", "createQuery",
                          "createQuery", "createQuery", "createQuery", "createQuery",
                          "disallowSuddenTermination", "logWithKeys com.brixo.norvex.run2",
                          "logWithKeys com.brixo.norvex.filecounts.run3", "setValue LastVersionRun=4",
                          "synchronize com.brixo.NorvexAgent", "disableJob com.brixo.NorvexAgent",
                          "syslog 5 com.brixo.NorvexAgent disabled", "setState 5", "exit 0"));
}

TEST(Run, SendsTheThirdMessageOnlyOnAnInternalInstallation) {
  AgentWorld world;
  world.installation.isInternal = true;
  EXPECT_TRUE(runScanAndReport());
  EXPECT_THAT(world.calls.of({"logWithKeys"}),
              ElementsAre("logWithKeys com.brixo.norvex.run2", "logWithKeys com.brixo.norvex.filecounts.run3",
                          "logWithKeys com.brixo.norvex.directoryinfo.run4"));
}

TEST(Run, IsTrueExactlyWhenTheScanGaveARecord) {
  AgentWorld good;
  EXPECT_TRUE(runScanAndReport());
  AgentWorld bad(ScanOutcome::nothing);
  EXPECT_FALSE(runScanAndReport());
}

TEST(Run, WithoutARecordReportsLogsAndRecordsNothing) {
  const DebugLevelScope level(1);
  AgentWorld world(ScanOutcome::nothing);
  world.storeVersion(3);
  EXPECT_FALSE(runScanAndReport());
  EXPECT_THAT(
      world.calls.of({"disallowSuddenTermination", "logWithKeys", "setValue", "synchronize", "syslog"}),
      IsEmpty());
  EXPECT_EQ(world.storedVersion(), 3);
}

TEST(Run, ThatFailedLeavesTheJobOnAndTheNextOneReports) {
  AgentWorld world(ScanOutcome::nothing);
  InMemoryActivity activity(world.calls, ActivityState::run);
  EXPECT_EQ(world.deliver(activity), "exit 0");
  EXPECT_THAT(activity.statesSet, ElementsAre(ActivityState::done));
  EXPECT_THAT(world.jobRegistry.disabledJobs, IsEmpty());
  EXPECT_EQ(world.storedVersion(), std::nullopt);
  EXPECT_THAT(world.systemLog.lines, IsEmpty());

  world.metadataIndex.volumes["/"].hasHealthCheck = true;
  EXPECT_EQ(world.deliver(ActivityState::run), "exit 0");
  EXPECT_THAT(world.diagnosticLog.messages, SizeIs(2));
  EXPECT_EQ(world.storedVersion(), 4);
  EXPECT_THAT(world.jobRegistry.disabledJobs, ElementsAre(agentLabelText));
}

TEST(Run, ThatAQueryRefusesLeavesTheJobOn) {
  AgentWorld world;
  world.metadataIndex.volumes["/"].refused = {queryPredicates[virtualMachines]};
  EXPECT_EQ(world.deliver(ActivityState::run), "exit 0");
  EXPECT_THAT(world.calls.of({"logWithKeys", "setValue", "disableJob", "syslog"}), IsEmpty());
}

TEST(Run, ASecondOneDoesNotReportAgain) {
  AgentWorld world;
  world.deliver(ActivityState::run);
  world.diagnosticLog.messages.clear();
  EXPECT_EQ(world.deliver(ActivityState::run), "exit 0");
  EXPECT_THAT(world.diagnosticLog.messages, IsEmpty());
}

TEST(Run, ThatWasKilledBeforeItsReportIsRecordedReportsAgain) {
  const struct {
    const char* claim;
    std::function<void(AgentWorld&)> arm;
  } rows[] = {
      {"in the scan", [](AgentWorld& world) { world.metadataIndex.whenStarting = kill; }},
      {"in the report", [](AgentWorld& world) { world.diagnosticLog.whenLogging = kill; }},
      {"before the record is safe",
       [](AgentWorld& world) { world.preferenceStore.whenSynchronizing = kill; }},
  };
  for (const auto& row : rows) {
    AgentWorld world;
    row.arm(world);
    InMemoryActivity activity(world.calls, ActivityState::run);
    EXPECT_THROW(handleActivity(activity), Killed) << row.claim;
    EXPECT_EQ(world.storedVersion(), std::nullopt) << row.claim;
    EXPECT_THAT(world.jobRegistry.disabledJobs, IsEmpty()) << row.claim;
    EXPECT_THAT(activity.statesSet, IsEmpty()) << row.claim;

    world.metadataIndex.whenStarting = nullptr;
    world.diagnosticLog.whenLogging = nullptr;
    world.preferenceStore.whenSynchronizing = nullptr;
    world.preferenceStore.pending.clear();  // a new process knows nothing of it
    world.diagnosticLog.messages.clear();
    EXPECT_EQ(world.deliver(ActivityState::run), "exit 0") << row.claim;
    EXPECT_THAT(world.diagnosticLog.messages, SizeIs(2)) << row.claim;
  }
}

TEST(Run, HoldsSuddenTerminationBackOnlyOnceTheScanIsDone) {
  AgentWorld world;
  EXPECT_EQ(world.start({"--force"}), "returns 0");
  const auto calls =
      world.calls.of({"allowSuddenTermination", "disallowSuddenTermination", "itemAtPath", "logWithKeys"});
  ASSERT_THAT(calls, SizeIs(6));
  EXPECT_EQ(calls[0], "allowSuddenTermination");
  EXPECT_EQ(calls[3], "disallowSuddenTermination");
}

// --- the summary line

TEST(Summary, IsNotWrittenAtDebugLevelZeroOrBelow) {
  for (const std::int64_t level : {0, -1}) {
    const DebugLevelScope scope(level);
    AgentWorld world;
    EXPECT_TRUE(runScanAndReport());
    EXPECT_THAT(world.systemLog.lines, IsEmpty());
  }
}

TEST(Summary, TellsTheTimeOfScanAndReportAndTheWholeRecord) {
  const struct {
    milliseconds scan, message, record;
    const char* seconds;
  } rows[] = {
      {milliseconds(0), milliseconds(0), milliseconds(90'000), "0.0"},
      {milliseconds(100), milliseconds(20), milliseconds(5000), "0.7"},  // 7 queries, 2 messages
      {milliseconds(1000), milliseconds(2625), milliseconds(1), "12.2"},
      {milliseconds(1'000'000), milliseconds(0), milliseconds(0), "7000.0"},
  };
  for (const auto& row : rows) {
    const DebugLevelScope level(1);
    AgentWorld world;
    world.metadataIndex.whenStarting = [&] { world.clock.advance(row.scan); };
    world.diagnosticLog.whenLogging = [&] { world.clock.advance(row.message); };
    world.preferenceStore.whenSynchronizing = [&] { world.clock.advance(row.record); };
    EXPECT_TRUE(runScanAndReport());
    const std::vector<std::string> lines = world.systemLog.lines;
    const std::string summary = NVXScanner().scan()->description();
    ASSERT_THAT(lines, SizeIs(2));  // the volume's line, then the summary
    EXPECT_EQ(lines[1], std::string("5 Norvex Scan completed in ") + row.seconds + " seconds.\n\n" + summary +
                            "\n | main:60");
  }
}

TEST(Summary, ComesAfterTheReleaseIsRecorded) {
  const DebugLevelScope level(1);
  AgentWorld world;
  EXPECT_TRUE(runScanAndReport());
  const auto calls = world.calls.of({"logWithKeys", "setValue", "synchronize", "syslog"});
  ASSERT_THAT(calls, SizeIs(6));
  EXPECT_EQ(calls[4], "synchronize com.brixo.NorvexAgent");
  EXPECT_TRUE(calls[5].starts_with("syslog 5 Norvex Scan completed in 0.0 seconds.")) << calls[5];
}

}  // namespace
}  // namespace norvex
