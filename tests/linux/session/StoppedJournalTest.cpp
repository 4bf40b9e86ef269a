// A real journal that has been stopped: its queue fills up, and whoever writes to it without a limit waits
// for ever. Run as root, who may stop it.
#include <gtest/gtest.h>

#include <chrono>
#include <filesystem>
#include <fstream>
#include <set>

#include "Journal.h"
#include "Session.h"
#include "platform/linux/FileDiagnosticLog.h"
#include "platform/linux/JournalDiagnosticLog.h"
#include "platform/linux/SyslogSystemLog.h"

namespace norvex {
namespace {

using std::chrono::steady_clock;

constexpr const char* kJournalCommand = "/lib/systemd/systemd-journald";
constexpr std::chrono::milliseconds kShortLimit{100};
constexpr int kMessages = 400;  // more than any queue that a system is likely to have set up
constexpr std::chrono::seconds kNotHungUp{30};

TEST(JournalDiagnosticLog, WhileTheJournalIsStoppedEachMessageIsRecordedOnceAndNobodyHangs) {
  const std::string state = std::filesystem::temp_directory_path() / "norvex-stopped-journal";
  std::filesystem::remove_all(state);
  FileDiagnosticLog file(state);
  JournalDiagnosticLog log("com.brixo.Stopped.service", file, kJournalSocket, kShortLimit);
  const auto start = steady_clock::now();
  {
    const HeldProcess held(kJournalCommand);
    for (int message = 0; message < kMessages; ++message) {
      const std::vector<DiagnosticPair> pairs = {{"number", std::to_string(message)}};
      log.logWithKeys("d", 5, pairs);
    }
  }
  EXPECT_LT(steady_clock::now() - start, kNotHungUp);

  std::multiset<std::string> recorded;
  std::size_t inFile = 0;
  std::ifstream lines(state + "/norvex/diagnostics.jsonl");
  for (std::string line; std::getline(lines, line); ++inFile) {
    recorded.insert(nlohmann::json::parse(line)["pairs"][0][1]);
  }
  std::filesystem::remove_all(state);
  EXPECT_GT(inFile, 0U) << "the queue has never been full";
  ASSERT_TRUE(eventually(
      [&] { return journalEntries("USER_UNIT=com.brixo.Stopped.service").size() == kMessages - inFile; }));
  for (const nlohmann::json& entry : journalEntries("USER_UNIT=com.brixo.Stopped.service")) {
    recorded.insert(std::string(entry["NORVEX_PAIR_01"]).substr(std::string("number=").size()));
  }
  std::multiset<std::string> sent;
  for (int message = 0; message < kMessages; ++message) sent.insert(std::to_string(message));
  EXPECT_EQ(recorded, sent);
}

TEST(SyslogSystemLog, WhileTheJournalIsStoppedNobodyHangs) {
  SyslogSystemLog log(kSystemLogSocket, kShortLimit);
  const auto start = steady_clock::now();
  {
    const HeldProcess held(kJournalCommand);
    for (int message = 0; message < kMessages; ++message) log.syslog(LogLevel::error, "while stopped");
  }
  EXPECT_LT(steady_clock::now() - start, kNotHungUp);
  ASSERT_TRUE(eventually([] { return !journalEntries("MESSAGE=while stopped").empty(); }));
  log.syslog(LogLevel::error, "when it goes on");
  EXPECT_TRUE(eventually([] { return journalEntries("MESSAGE=when it goes on").size() == 1; }));
}

}  // namespace
}  // namespace norvex
