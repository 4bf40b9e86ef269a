// The agent's job and its journal as a real service manager and a real journal have them.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <filesystem>
#include <fstream>
#include <sstream>

#include "Session.h"
#include "agent/AgentIdentity.h"
#include "platform/linux/Environment.h"
#include "platform/linux/JournalDiagnosticLog.h"
#include "platform/linux/SyslogSystemLog.h"
#include "tool/ReportedMessages.h"
#include "tool/SystemdAgentJob.h"
#include "tool/SystemdAgentJournal.h"

namespace norvex {
namespace {

std::int64_t secondsSince1970() {
  using std::chrono::duration_cast, std::chrono::seconds, std::chrono::system_clock;
  return duration_cast<seconds>(system_clock::now().time_since_epoch()).count();
}

class NoOtherLog final : public DiagnosticLog {
 public:
  void logWithKeys(std::string_view, int, std::span<const DiagnosticPair>) override { ADD_FAILURE(); }
};

// Sends what an agent would, and waits until the journal has it.
ReportedMessages reportedOverTheJournal(const std::vector<DiagnosticPair>& pairs, const std::string& domain) {
  NoOtherLog other;
  JournalDiagnosticLog(std::string(agentLabel) + ".service", other).logWithKeys(domain, 5, pairs);
  std::ostringstream errors;
  Console err(errors, {});
  Faults faults(err);
  SystemdAgentJournal journal;
  ReportedMessages found;
  eventually([&] {
    found = reportedMessages(journal, "/nowhere/diagnostics.jsonl", 0, faults);
    return std::any_of(found.messages.begin(), found.messages.end(),
                       [&](const ReportedMessage& message) { return message.domain == domain; });
  });
  EXPECT_EQ(errors.str(), "");
  return found;
}

TEST(SystemdAgentJournal, ReadsWhatTheAgentHasReported) {
  std::vector<DiagnosticPair> pairs;
  for (int pair = 0; pair < 66; ++pair)
    pairs.push_back({"com.brixo.message.key_" + std::to_string(pair), std::to_string(pair)});
  const std::int64_t before = secondsSince1970();
  const ReportedMessages found = reportedOverTheJournal(pairs, "com.brixo.norvex.run2");
  ASSERT_EQ(found.messages.size(), 1U);
  const ReportedMessage& message = found.messages.front();
  EXPECT_EQ(message.source, ReportedMessage::Source::journal);
  EXPECT_EQ(message.level, 5);
  EXPECT_GE(message.time, before * 1'000'000);
  ASSERT_EQ(message.pairs.size(), pairs.size());
  for (std::size_t at = 0; at < pairs.size(); ++at) {
    EXPECT_EQ(message.pairs[at].first, pairs[at].key);
    EXPECT_EQ(message.pairs[at].second, pairs[at].value);
  }
  EXPECT_TRUE(found.damaged.empty());
}

TEST(SystemdAgentJournal, TellsTheAgentsOwnLinesFromItsMessages) {
  SyslogSystemLog().syslog(LogLevel::error, "Failed to get it");
  SystemdAgentJournal journal;
  std::vector<AgentJournalEntry> lines;
  ASSERT_TRUE(eventually([&] {
    lines = journal.entriesSince(0).value();
    std::erase_if(lines, [](const AgentJournalEntry& entry) { return entry.text != "Failed to get it"; });
    return !lines.empty();
  }));
  EXPECT_EQ(lines.front().priority, 3);
  EXPECT_FALSE(lines.front().isDiagnostic);
  EXPECT_TRUE(journal.entriesSince(secondsSince1970() + 3600).value().empty());
}

class AgentJobInSession : public ::testing::Test {
 protected:
  // Each with the job as a package leaves it: installed, and not switched on by the user.
  void install(const std::string& command = "/bin/true") {
    installJob("NorvexAgent", unitsOfPackages(), command);
  }
  void TearDown() override {
    shell("systemctl --user unmask --quiet com.brixo.NorvexAgent.run4.timer 2>/dev/null");
    shell("systemctl --user disable --now --quiet com.brixo.NorvexAgent.run4.timer 2>/dev/null");
    shell("rm -rf " + unitsOfPackages() + "/com.brixo.NorvexAgent*; systemctl --user daemon-reload");
  }

  SystemdAgentJob job{processEnvironment()};
};

TEST_F(AgentJobInSession, IsNotThereWhereItIsNotInstalled) {
  const auto state = job.state();
  ASSERT_FALSE(state);
  EXPECT_EQ(state.error().code, ENOENT);
}

TEST_F(AgentJobInSession, IsSwitchedOnAndOff) {
  install();
  ASSERT_TRUE(job.enable());
  AgentJobState state = job.state().value();
  EXPECT_TRUE(state.isEnabled);
  EXPECT_FALSE(state.isMaskedForAll);
  ASSERT_TRUE(state.nextRun);
  EXPECT_GT(*state.nextRun, secondsSince1970());
  ASSERT_TRUE(job.disable());
  state = job.state().value();
  EXPECT_FALSE(state.isEnabled);
  EXPECT_FALSE(state.nextRun);
}

TEST_F(AgentJobInSession, TellsOfItsLastRun) {
  install("/bin/false");
  ASSERT_TRUE(job.enable());
  EXPECT_FALSE(job.state().value().lastStart);
  EXPECT_EQ(job.run().value(), AgentJob::Started::yes);
  const AgentJobState state = job.state().value();
  EXPECT_EQ(state.lastResult, "exit-code");
  ASSERT_TRUE(state.lastStart);
  EXPECT_LE(*state.lastStart, secondsSince1970());
  EXPECT_FALSE(state.isRunning);
}

TEST_F(AgentJobInSession, DoesNotRunWhereItsConditionsAreNotMet) {
  install();
  std::filesystem::create_directories(unitsOfPackages() + "/com.brixo.NorvexAgent.service.d");
  std::ofstream(unitsOfPackages() + "/com.brixo.NorvexAgent.service.d/no.conf")
      << "[Unit]\nConditionPathExists=/not/there\n";
  ASSERT_TRUE(sessionManager().reload());
  EXPECT_EQ(job.run().value(), AgentJob::Started::conditionsNotMet);
}

TEST_F(AgentJobInSession, KnowsThatItsUserIsNotToBeTracked) {
  install();
  EXPECT_FALSE(job.state().value().doNotTrack);
  ASSERT_TRUE(shell("systemctl --user set-environment DO_NOT_TRACK=1"));
  EXPECT_TRUE(job.state().value().doNotTrack);
  ASSERT_TRUE(shell("systemctl --user unset-environment DO_NOT_TRACK"));
}

}  // namespace
}  // namespace norvex
