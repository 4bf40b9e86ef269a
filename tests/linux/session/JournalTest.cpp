// What a real journal makes of the messages and lines that it is sent.
#include <gtest/gtest.h>
#include <unistd.h>

#include <map>

#include "Journal.h"
#include "platform/linux/DiagnosticMessageText.h"
#include "platform/linux/JournalDiagnosticLog.h"
#include "platform/linux/SyslogSystemLog.h"

namespace norvex {
namespace {

class NoOtherLog final : public DiagnosticLog {
 public:
  void logWithKeys(std::string_view, int, std::span<const DiagnosticPair>) override { ++messages; }
  int messages = 0;
};

std::vector<DiagnosticPair> manyPairs() {
  std::vector<DiagnosticPair> pairs;
  for (int pair = 1; pair <= 66; ++pair) {
    pairs.push_back({"com.brixo.message.key" + std::to_string(pair), std::to_string(pair * 1000)});
  }
  return pairs;
}

std::string textOf(const nlohmann::json& entry, const std::string& field) {
  return entry.is_object() && entry.contains(field) && entry[field].is_string() ? entry[field] : "(absent)";
}

TEST(JournalDiagnosticLog, TheJournalKeepsEveryFieldOfAMessage) {
  NoOtherLog other;
  const std::vector<DiagnosticPair> pairs = manyPairs();
  JournalDiagnosticLog("com.brixo.Fields.service", other).logWithKeys("com.brixo.norvex.run2", 5, pairs);
  const nlohmann::json entry = journalEntry("USER_UNIT=com.brixo.Fields.service");
  EXPECT_EQ(textOf(entry, "MESSAGE_ID"), "3d3c8faa00f14245afe45c1dcbb559ff");
  EXPECT_EQ(textOf(entry, "PRIORITY"), "5");
  EXPECT_EQ(textOf(entry, "SYSLOG_IDENTIFIER"), "NorvexAgent");
  EXPECT_EQ(textOf(entry, "NORVEX_DOMAIN"), "com.brixo.norvex.run2");
  EXPECT_EQ(textOf(entry, "NORVEX_LEVEL"), "5");
  EXPECT_EQ(textOf(entry, "MESSAGE"), diagnosticMessageJson("com.brixo.norvex.run2", 5, pairs));
  EXPECT_EQ(textOf(entry, "_PID"), std::to_string(::getpid()));
  EXPECT_EQ(textOf(entry, "_TRANSPORT"), "journal");

  std::map<std::string, std::string> numbered;
  for (const auto& [field, value] : entry.items()) {
    if (field.starts_with("NORVEX_PAIR_")) numbered[field] = value;
  }
  std::vector<std::string> inOrder;
  for (const auto& [field, value] : numbered) inOrder.push_back(value);
  std::vector<std::string> sent;
  for (const DiagnosticPair& pair : pairs) sent.push_back(pair.key + "=" + pair.value);
  EXPECT_EQ(inOrder, sent);
  EXPECT_EQ(other.messages, 0);
}

TEST(JournalDiagnosticLog, AMessageIsFoundUnderItsUnit) {
  NoOtherLog other;
  JournalDiagnosticLog("com.brixo.Unit.service", other).logWithKeys("d", 5, {});
  EXPECT_EQ(textOf(journalEntry("--user-unit=com.brixo.Unit.service"), "NORVEX_DOMAIN"), "d");
}

TEST(JournalDiagnosticLog, AMessageThatIsTooLargeForADatagramIsKept) {
  NoOtherLog other;
  const std::vector<DiagnosticPair> pairs = {{"large", std::string(1'000'000, 'x')}, {"lines", "a\nb"}};
  JournalDiagnosticLog("com.brixo.Large.service", other).logWithKeys("d", 5, pairs);
  const nlohmann::json entry = journalEntry("USER_UNIT=com.brixo.Large.service");
  EXPECT_EQ(textOf(entry, "NORVEX_PAIR_01"), "large=" + pairs[0].value);
  EXPECT_EQ(textOf(entry, "NORVEX_PAIR_02"), "lines=a\nb");
  EXPECT_EQ(other.messages, 0);
}

TEST(SyslogSystemLog, TheJournalKnowsLevelIdentifierFacilityAndProcess) {
  struct Case {
    LogLevel level;
    const char* message;
    const char* priority;
  };
  const Case cases[] = {{LogLevel::error, "An error of 100%", "3"}, {LogLevel::notice, "A notice: [1]", "5"}};
  for (const Case& row : cases) {
    SyslogSystemLog().syslog(row.level, row.message);
    const nlohmann::json entry = journalEntry(std::string("MESSAGE=") + row.message);
    EXPECT_EQ(textOf(entry, "PRIORITY"), row.priority) << row.message;
    EXPECT_EQ(textOf(entry, "SYSLOG_IDENTIFIER"), "NorvexAgent");
    EXPECT_EQ(textOf(entry, "SYSLOG_FACILITY"), "1");
    EXPECT_EQ(textOf(entry, "SYSLOG_PID"), std::to_string(::getpid()));
    EXPECT_EQ(textOf(entry, "_TRANSPORT"), "syslog");
  }
}

}  // namespace
}  // namespace norvex
