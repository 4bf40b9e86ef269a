#include "platform/linux/JournalDiagnosticLog.h"

#include <gtest/gtest.h>

#include <set>

#include "LogListener.h"
#include "ScratchFolder.h"
#include "platform/linux/DiagnosticMessageIds.h"
#include "platform/linux/FileDiagnosticLog.h"
#include "platform/linux/JournalEntry.h"

namespace norvex {
namespace {

constexpr const char* kFile = "norvex/diagnostics.jsonl";
constexpr std::chrono::milliseconds kShortLimit{50};

struct World {
  ScratchFolder folder;
  std::string socket = folder.at("journal");
  FileDiagnosticLog file{folder.path(), [] { return std::chrono::system_clock::time_point(); }};
  JournalDiagnosticLog log{"", file, socket, kShortLimit};

  std::string lines() const { return contentOf(folder.at(kFile)); }
};

const std::vector<DiagnosticPair> kPairs = {{"b", "2"}, {"a", "1"}};
constexpr const char* kLine =
    R"({"domain":"com.brixo.norvex.run2","level":5,"pairs":[["b","2"],["a","1"]],"time":"1970-01-01T00:00:00Z"})"
    "\n";

TEST(JournalEntry, StatesTheLengthOfAValueThatHasLines) {
  JournalEntry entry;
  entry.add("PLAIN", "a=b");
  entry.add("EMPTY", "");
  entry.add("LINES", std::string(258, 'x') + "\n");
  EXPECT_EQ(entry.bytes(), "PLAIN=a=b\nEMPTY=\nLINES\n" + std::string("\x03\x01\0\0\0\0\0\0", 8) +
                               std::string(258, 'x') + "\n\n");
}

TEST(DiagnosticMessageIds, AreDifferentAndOfTheJournalsForm) {
  std::set<std::string_view> ids;
  for (const DiagnosticMessageId& row : kDiagnosticMessageIds) {
    EXPECT_EQ(row.id.size(), 32U);
    EXPECT_EQ(row.id.find_first_not_of("0123456789abcdef"), std::string_view::npos);
    ids.insert(row.id);
  }
  EXPECT_EQ(ids.size(), kDiagnosticMessageIds.size());
  EXPECT_EQ(diagnosticMessageId("com.brixo.norvex.run1"), "");
}

TEST(JournalDiagnosticLog, AMessageIsOneEntryWithItsPairsNumbered) {
  World world;
  LogListener journal(world.socket);
  JournalDiagnosticLog(std::string("com.brixo.NorvexAgent.service"), world.file, world.socket)
      .logWithKeys("com.brixo.norvex.run2", 5, kPairs);
  EXPECT_EQ(journal.next(),
            "MESSAGE_ID=3d3c8faa00f14245afe45c1dcbb559ff\n"
            "PRIORITY=5\n"
            "SYSLOG_IDENTIFIER=NorvexAgent\n"
            "USER_UNIT=com.brixo.NorvexAgent.service\n"
            "NORVEX_DOMAIN=com.brixo.norvex.run2\n"
            "NORVEX_LEVEL=5\n"
            "NORVEX_PAIR_01=b=2\n"
            "NORVEX_PAIR_02=a=1\n"
            R"(MESSAGE={"domain":"com.brixo.norvex.run2","level":5,"pairs":[["b","2"],["a","1"]]})"
            "\n");
  EXPECT_EQ(journal.next(), "(nothing)");
  EXPECT_EQ(world.lines(), "") << "recorded twice";
}

TEST(JournalDiagnosticLog, WithoutAUnitOrAKnownDomainThoseFieldsAreLeftOut) {
  World world;
  LogListener journal(world.socket);
  world.log.logWithKeys("d", 3, {});
  EXPECT_EQ(journal.next(),
            "PRIORITY=3\nSYSLOG_IDENTIFIER=NorvexAgent\nNORVEX_DOMAIN=d\nNORVEX_LEVEL=3\n"
            "MESSAGE={\"domain\":\"d\",\"level\":3,\"pairs\":[]}\n");
}

TEST(JournalDiagnosticLog, AMessageOfAnySizeArrives) {
  World world;
  LogListener journal(world.socket);
  const std::vector<DiagnosticPair> large = {{"key", std::string(4'000'000, 'x')}};
  world.log.logWithKeys("d", 5, large);
  EXPECT_NE(journal.next().find("\nNORVEX_PAIR_01=key=" + large[0].value + "\n"), std::string::npos);
  EXPECT_EQ(world.lines(), "");
}

TEST(JournalDiagnosticLog, WhereNoJournalListensTheFileTakesTheMessage) {
  World world;
  world.log.logWithKeys("com.brixo.norvex.run2", 5, kPairs);
  EXPECT_EQ(world.lines(), kLine);
  { const LogListener gone(world.socket); }  // the socket's file stays
  world.log.logWithKeys("com.brixo.norvex.run2", 5, kPairs);
  EXPECT_EQ(world.lines(), std::string(kLine) + kLine);
}

TEST(JournalDiagnosticLog, WhereTheJournalIsStoppedTheFileTakesTheMessage) {
  World world;
  LogListener journal(world.socket);
  journal.fill(world.socket);
  world.log.logWithKeys("com.brixo.norvex.run2", 5, kPairs);
  EXPECT_EQ(world.lines(), kLine);
  while (journal.next() != "(nothing)") {
  }
  world.log.logWithKeys("com.brixo.norvex.run2", 5, kPairs);
  EXPECT_NE(journal.next(), "(nothing)") << "a journal that goes on is written to again";
  EXPECT_EQ(world.lines(), kLine);
}

}  // namespace
}  // namespace norvex
