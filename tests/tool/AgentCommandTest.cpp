#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <functional>
#include <nlohmann/json.hpp>

#include "MeasuredWorld.h"
#include "agent/AgentIdentity.h"
#include "tool/AgentControlCommand.h"
#include "tool/AgentStatusCommand.h"

namespace norvex {
namespace {

using nlohmann::json;
using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::Not;

constexpr std::int64_t kMicroseconds = 1'000'000;

// What a run of this release leaves behind, two hours ago.
void letReport(MeasuredWorld& machine) {
  constexpr std::int64_t kTime = (MeasuredWorld::kNow - 7200) * kMicroseconds;
  machine.preferenceStore.setValue(lastVersionRunKey, currentRunVersion, agentLabel);
  for (const char* domain : {"a.run2", "a.filecounts.run3"}) {
    machine.journal.entries.push_back(
        {.time = kTime,
         .priority = 5,
         .text = std::string(R"({"domain":")") + domain + R"(","level":5,"pairs":[]})",
         .isDiagnostic = true});
  }
  AgentJobState& job = machine.job.content;
  job.isEnabled = false;
  job.lastStart = MeasuredWorld::kNow - 7260;
  job.lastEnd = MeasuredWorld::kNow - 7200;
  job.lastResult = "success";
}

json statusOf(MeasuredWorld& machine) {
  runAgentStatus(machine.world, {.json = true});
  return json::parse(machine.output());
}

TEST(AgentStatusOf, AReleaseThatHasReported) {
  MeasuredWorld machine;
  letReport(machine);
  EXPECT_EQ(runAgentStatus(machine.world, {}), ExitStatus::success);
  EXPECT_EQ(machine.output(),
            "The agent's report of this release\n"
            "  Reported    2023-11-14 20:13:20 +0000 (2 hours ago), 2 messages; see them\n"
            "              with: norvexctl log\n"
            "  Job         off: this release has reported, and the agent has switched itself\n"
            "              off\n"
            "  Last run    2023-11-14 20:12:20 +0000 (2 hours ago), ended well\n");
  EXPECT_EQ(machine.errors(), "");
}

TEST(AgentStatusOf, AReleaseThatHasNotReportedShowsTheLinesOfTheLastRunAlone) {
  MeasuredWorld machine;
  machine.job.content.lastStart = MeasuredWorld::kNow - 60;
  machine.job.content.lastResult = "success";
  machine.job.content.nextRun = MeasuredWorld::kNow + 600;
  const auto line = [](std::int64_t age, int priority, const char* text) {
    return AgentJournalEntry{
        .time = (MeasuredWorld::kNow - age) * kMicroseconds, .priority = priority, .text = text};
  };
  machine.journal.entries = {line(90, 3, "of an earlier run"), line(30, 3, "Failed to get it"),
                             line(20, 5, "a notice")};
  const json status = statusOf(machine);
  EXPECT_EQ(status["reported"], false);
  EXPECT_EQ(status["reportedAt"], nullptr);
  EXPECT_EQ(status["job"]["on"], true);
  EXPECT_EQ(status["job"]["nextRun"], "2023-11-14T22:23:20Z");
  ASSERT_EQ(status["log"].size(), 1U);
  EXPECT_EQ(status["log"][0]["message"], "Failed to get it");
  EXPECT_EQ(status["errors"], json::array());
}

TEST(AgentStatusOf, AMachineWithoutAManagerTellsTheRestAndFails) {
  MeasuredWorld machine;
  machine.job.failure = Error{ENOMEDIUM, "the session bus: No medium found"};
  EXPECT_EQ(runAgentStatus(machine.world, {}), ExitStatus::failed);
  EXPECT_THAT(machine.output(), HasSubstr("  Reported    not yet\n"));
  EXPECT_THAT(machine.errors(),
              HasSubstr("the session bus: No medium found; this needs the service manager"));
}

TEST(AgentStatusOf, NamesWhoeverHasDecided) {
  const struct {
    const char* decidedBy;
    std::function<void(MeasuredWorld&)> decide;
  } cases[] = {
      {"", [](MeasuredWorld&) {}},
      {"user", [](MeasuredWorld& machine) { machine.job.content.isEnabled = false; }},
      {"reported", letReport},
      {"doNotTrack", [](MeasuredWorld& machine) { machine.job.content.doNotTrack = true; }},
      {"administrator", [](MeasuredWorld& machine) { machine.job.content.isMaskedForAll = true; }},
      {"administrator", [](MeasuredWorld& machine) { machine.putFile("/etc/norvex/disabled", 0); }},
  };
  for (const auto& each : cases) {
    MeasuredWorld machine;
    each.decide(machine);
    const json status = statusOf(machine);
    EXPECT_EQ(status["job"]["decidedBy"], each.decidedBy);
    EXPECT_EQ(status["job"]["on"], std::string(each.decidedBy).empty());
  }
}

TEST(AgentRun, StartsTheJob) {
  MeasuredWorld machine;
  EXPECT_EQ(runAgentRun(machine.world, {}), ExitStatus::success);
  EXPECT_THAT(machine.job.calls, ElementsAre("run"));
  EXPECT_EQ(machine.output(), "Started; see how it went with: norvexctl agent status\n");
}

TEST(AgentRun, FailsWhenTheConditionsOfTheJobAreNotMet) {
  MeasuredWorld machine;
  machine.job.started = AgentJob::Started::conditionsNotMet;
  EXPECT_EQ(runAgentRun(machine.world, {.json = true}), ExitStatus::failed);
  EXPECT_EQ(json::parse(machine.output())["outcome"], "conditionsNotMet");
  EXPECT_THAT(machine.errors(), HasSubstr("not started: the job's conditions are not met"));
}

TEST(AgentRun, WakesAnAgentThatWaitsWhereThereIsNoManager) {
  MeasuredWorld machine;
  machine.job.failure = Error{ECONNREFUSED, "the session bus: Connection refused"};
  EXPECT_EQ(runAgentRun(machine.world, {}), ExitStatus::failed);
  machine.agentWaits = true;
  EXPECT_EQ(runAgentRun(machine.world, {}), ExitStatus::success);
  EXPECT_THAT(machine.output(), HasSubstr("The agent that was waiting has got the word to run"));
}

TEST(AgentEnable, SwitchesOnAndSaysWhatStillKeepsTheAgentFromRunning) {
  MeasuredWorld machine;
  machine.job.content.doNotTrack = true;
  EXPECT_EQ(runAgentEnable(machine.world, {}), ExitStatus::success);
  EXPECT_THAT(machine.job.calls, ElementsAre("enable"));
  EXPECT_THAT(machine.output(),
              HasSubstr("is on for you. It does not run all the same: DO_NOT_TRACK is set"));
}

TEST(AgentEnable, SaysThatAReleaseThatHasReportedSwitchesItselfOffAgain) {
  MeasuredWorld machine;
  letReport(machine);
  runAgentEnable(machine.world, {});
  EXPECT_THAT(machine.output(), HasSubstr("at its next start it switches itself off again"));
}

TEST(AgentDisable, SwitchesOff) {
  MeasuredWorld machine;
  EXPECT_EQ(runAgentDisable(machine.world, {.json = true}), ExitStatus::success);
  EXPECT_FALSE(machine.job.content.isEnabled);
  EXPECT_EQ(json::parse(machine.output())["outcome"], "disabled");
}

TEST(AgentDisable, SaysWhatIsNotInstalled) {
  MeasuredWorld machine;
  machine.job.failure = Error{ENOENT, "com.brixo.NorvexAgent.service: no such unit"};
  EXPECT_EQ(runAgentDisable(machine.world, {}), ExitStatus::failed);
  EXPECT_EQ(machine.output(), "");
  EXPECT_THAT(machine.errors(), HasSubstr("no such unit; is the package with the agent's job installed?"));
}

}  // namespace
}  // namespace norvex
