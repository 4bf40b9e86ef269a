// What one process comes to, by how it was started. The watchdog is installed once a process, so each of
// these runs in a process of its own.
#include <gmock/gmock.h>

#include <cstdio>
#include <cstdlib>

#include "tests/agent/AgentWorld.h"

namespace norvex {
namespace {

struct Start {
  const char* claim;
  std::optional<ActivityState> state;  // absent: started with --force
  std::optional<double> storedVersion;
  ScanOutcome scan;
  bool growsTooLarge;
  const char* outcome;
};

constexpr Start kStarts[] = {
    {"forced, a record",
     {},
     {},
     ScanOutcome::record,
     false,
     "watchdog no, report yes, recorded 4, job on, done no, returns 0"},
    {"forced, a record, the value is not read",
     {},
     4,
     ScanOutcome::record,
     false,
     "watchdog no, report yes, recorded 4, job on, done no, returns 0"},
    {"forced, no record",
     {},
     {},
     ScanOutcome::nothing,
     false,
     "watchdog no, report no, recorded -, job on, done no, returns 0"},
    {"forced, however large",
     {},
     {},
     ScanOutcome::record,
     true,
     "watchdog no, report yes, recorded 4, job on, done no, returns 0"},
    {"the check-in",
     ActivityState::checkIn,
     {},
     ScanOutcome::record,
     false,
     "watchdog no, report no, recorded -, job on, done no, waits"},
    {"already reported", ActivityState::run, 4, ScanOutcome::record, false,
     "watchdog no, report no, recorded 4, job off, done yes, exit 0"},
    {"reported by a later release", ActivityState::run, 5, ScanOutcome::record, false,
     "watchdog no, report no, recorded 5, job off, done yes, exit 0"},
    {"never run, a record",
     ActivityState::run,
     {},
     ScanOutcome::record,
     false,
     "watchdog yes, report yes, recorded 4, job off, done yes, exit 0"},
    {"an earlier release ran, a record", ActivityState::run, 3, ScanOutcome::record, false,
     "watchdog yes, report yes, recorded 4, job off, done yes, exit 0"},
    {"never run, no record",
     ActivityState::run,
     {},
     ScanOutcome::nothing,
     false,
     "watchdog yes, report no, recorded -, job on, done yes, exit 0"},
    {"an earlier release ran, no record", ActivityState::run, 3, ScanOutcome::nothing, false,
     "watchdog yes, report no, recorded 3, job on, done yes, exit 0"},
    {"too large while scanning", ActivityState::run, 3, ScanOutcome::record, true,
     "watchdog yes, report no, recorded 3, job off, done no, exit 0"},
};

std::string outcomeOf(const Start& start) {
  AgentWorld world(start.scan);
  if (start.storedVersion) world.storeVersion(*start.storedVersion);
  if (start.growsTooLarge) {
    world.processMemoryInfo.use = MemoryUse{600'000'000, 500'000'000};
    world.metadataIndex.whenStarting = [&] { world.memoryPressureSource.fire(); };
  }
  InMemoryActivity activity(world.calls, start.state.value_or(ActivityState::run));
  std::string end;
  if (start.state) {
    EXPECT_EQ(world.start(), "waits");
    end = world.deliver(activity);
  } else {
    end = world.start({"--force"});
  }
  const auto answer = [](bool yes) { return std::string(yes ? "yes" : "no"); };
  const std::optional<double> version = world.storedVersion();
  return "watchdog " + answer(!world.memoryPressureSource.subscriptions.empty()) + ", report " +
         answer(!world.diagnosticLog.messages.empty()) + ", recorded " +
         (version ? std::to_string(static_cast<int>(*version)) : "-") + ", job " +
         (world.jobRegistry.disabledJobs.contains(agentLabelText) ? "off" : "on") + ", done " +
         answer(activity.state() == ActivityState::done) + ", " + end;
}

// Ends the process: status 0 when `text` is what was expected, else 1 with a word about it.
[[noreturn]] void endWith(const std::string& text, const std::string& expected) {
  if (text != expected) std::fprintf(stderr, "got: %s\nnot: %s\n", text.c_str(), expected.c_str());
  std::_Exit(text == expected && !::testing::Test::HasFailure() ? 0 : 1);
}

// Its statements run in programs started anew, not in copies of one that may have a watchdog already.
class WatchdogDeathTest : public ::testing::Test {
 protected:
  void SetUp() override { GTEST_FLAG_SET(death_test_style, "threadsafe"); }
};

class OutcomeDeathTest : public WatchdogDeathTest, public ::testing::WithParamInterface<Start> {};

TEST_P(OutcomeDeathTest, IsThatOfItsRow) {
  EXPECT_EXIT(endWith(outcomeOf(GetParam()), GetParam().outcome), ::testing::ExitedWithCode(0), "")
      << GetParam().claim;
}

INSTANTIATE_TEST_SUITE_P(EveryStart, OutcomeDeathTest, ::testing::ValuesIn(kStarts));

TEST_F(WatchdogDeathTest, OneWatchdogServesAllRunsOfAProcess) {
  const auto twoRuns = [] {
    AgentWorld world(ScanOutcome::nothing);
    world.deliver(ActivityState::run);
    world.deliver(ActivityState::run);
    endWith(std::to_string(world.memoryPressureSource.subscriptions.size()) + " watchdog, " +
                std::to_string(world.calls.of({"itemAtPath"}).size()) + " scans",
            "1 watchdog, 2 scans");
  };
  EXPECT_EXIT(twoRuns(), ::testing::ExitedWithCode(0), "");
}

TEST_F(WatchdogDeathTest, TheWatchdogWatchesBeforeTheScanBegins) {
  const auto run = [] {
    AgentWorld world;
    world.deliver(ActivityState::run);
    const auto calls = world.calls.of({"copyValue", "createMemoryPressure", "openBackupSettings"});
    endWith(calls.at(0) + ", " + calls.at(1) + ", " + calls.at(2),
            "copyValue LastVersionRun, createMemoryPressure, openBackupSettings");
  };
  EXPECT_EXIT(run(), ::testing::ExitedWithCode(0), "");
}

}  // namespace
}  // namespace norvex
