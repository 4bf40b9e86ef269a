#include "tool/LogCommand.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <fstream>
#include <nlohmann/json.hpp>

#include "ToolTestWorld.h"
#include "tool/MomentText.h"
#include "tool/ReportedMessages.h"

namespace norvex {
namespace {

using ::testing::HasSubstr;

constexpr std::int64_t kMicroseconds = 1'000'000;

// 2023-11-14 22:00:00, :05 and :10 UTC.
constexpr std::int64_t kFirst = 1'699'999'200, kSecond = kFirst + 300, kThird = kFirst + 600;

AgentJournalEntry messageEntry(std::int64_t time, const std::string& text) {
  return {.time = time * kMicroseconds, .priority = 5, .text = text, .isDiagnostic = true};
}

const char* const kSizes =
    R"({"domain":"a.b.run2","level":5,"pairs":[["a.m.size","126"],["a.m.count_of_it","2"]]})";
const char* const kCounts = R"({"domain":"a.b.run3","level":5,"pairs":[["a.m.files","1200"]]})";

class Log : public ::testing::Test {
 protected:
  Log() {
    tool.journal.entries = {messageEntry(kFirst, kSizes),
                            {.time = kSecond * kMicroseconds, .priority = 5, .text = "a.b disabled"},
                            messageEntry(kThird, kCounts)};
  }

  void writeFile(const std::string& lines) { std::ofstream(tool.world.messagesFile) << lines; }

  ToolTestWorld tool;
};

TEST_F(Log, ShowsTheMessagesOfTheJournalAndOfTheFileTheNewestLast) {
  writeFile(R"({"domain":"a.b.run3","level":5,"pairs":[["x","1"],["y.z","2"]],"time":"2023-11-14T22:05:00Z"})"
            "\n");
  EXPECT_EQ(runLog(tool.world, {}), ExitStatus::success);
  EXPECT_EQ(tool.output(),
            "a.b.run2  2023-11-14 22:00:00 +0000  (journal)\n"
            "  size         126\n"
            "  count_of_it  2\n"
            "\n"
            "a.b.run3  2023-11-14 22:05:00 +0000  (file)\n"
            "  x    1\n"
            "  y.z  2\n"
            "\n"
            "a.b.run3  2023-11-14 22:10:00 +0000  (journal)\n"
            "  files  1200\n");
  EXPECT_EQ(tool.errors(), "");
}

TEST_F(Log, KeepsToADomainAndAMoment) {
  EXPECT_EQ(runLog(tool.world, {.domain = "run2"}), ExitStatus::success);
  EXPECT_THAT(tool.output(), testing::StartsWith("a.b.run2  "));
  EXPECT_THAT(tool.output(), testing::Not(HasSubstr("a.b.run3")));
  tool.outText.str("");
  EXPECT_EQ(runLog(tool.world, {.since = "2023-11-14 22:01"}), ExitStatus::success);
  EXPECT_THAT(tool.output(), testing::StartsWith("a.b.run3  "));
}

TEST_F(Log, SaysThatNothingWasReported) {
  tool.journal.entries.clear();
  EXPECT_EQ(runLog(tool.world, {}), ExitStatus::success);
  EXPECT_EQ(tool.output(), "No message has been reported.\n");
}

TEST_F(Log, TellsOfDamagedRecordsAndGoesOn) {
  tool.journal.entries.push_back(messageEntry(kThird, "{"));
  writeFile(
      "{\"domain\":\"a\"}\n{\"domain\":\"a.b.run9\",\"level\":5,\"pairs\":[],\"time\":\"2023-11-14T22:05:"
      "00Z\"}\n"
      "{\"domain\":\"torn");
  EXPECT_EQ(runLog(tool.world, {.json = true}), ExitStatus::success);
  EXPECT_EQ(
      tool.errors(),
      "norvexctl: the journal: passed over a damaged message: it is no JSON, or only the beginning of some\n"
      "norvexctl: <cache>/diagnostics.jsonl:1: passed over a damaged message: it lacks a domain, a level or "
      "pairs\n"
      "norvexctl: <cache>/diagnostics.jsonl:3: passed over a damaged message: it is no JSON, or only the "
      "beginning of some\n");
  const auto document = nlohmann::json::parse(tool.outText.str());
  ASSERT_EQ(document["messages"].size(), 3U);
  EXPECT_EQ(document["messages"][1]["domain"], "a.b.run9");
  EXPECT_EQ(document["messages"][1]["time"], "2023-11-14T22:05:00Z");
  EXPECT_EQ(document["messages"][0]["source"], "journal");
  EXPECT_EQ(document["messages"][0]["pairs"][0], nlohmann::json::array({"a.m.size", "126"}));
  EXPECT_EQ(document["damaged"].size(), 3U);
  EXPECT_EQ(document["damaged"][2]["line"], 3);
}

TEST_F(Log, ReadsTheFileWhenTheJournalCannotBeReadAndFails) {
  tool.journal.failure = Error{13, "the journal cannot be read: Permission denied"};
  writeFile(R"({"domain":"d","level":5,"pairs":[],"time":"2023-11-14T22:05:00Z"})");
  EXPECT_EQ(runLog(tool.world, {}), ExitStatus::failed);
  EXPECT_EQ(tool.output(), "d  2023-11-14 22:05:00 +0000  (file)\n");
  EXPECT_THAT(tool.errors(), HasSubstr("Permission denied"));
}

TEST_F(Log, RefusesAMomentThatMakesNoSense) {
  EXPECT_EQ(runLog(tool.world, {.since = "2023-02-31"}), ExitStatus::usage);
  EXPECT_EQ(tool.output(), "");
}

TEST_F(Log, ShowsNoControlCharactersOfAMessage) {
  tool.journal.entries = {
      messageEntry(kFirst, R"({"domain":"\u001b[2J","level":5,"pairs":[["\nk","\u202e"]]})")};
  runLog(tool.world, {});
  EXPECT_THAT(tool.output(), testing::StartsWith("\\x1B[2J  "));
  EXPECT_THAT(tool.output(), HasSubstr("\\nk  \\u202E\n"));
}

TEST(ReportedMessage, IsRefusedUnlessItHasTheShapeOfOne) {
  for (const char* text :
       {"", "[]", "1", R"({"domain":1,"level":5,"pairs":[]})", R"({"domain":"d","level":"5","pairs":[]})",
        R"({"domain":"d","level":5,"pairs":{}})", R"({"domain":"d","level":5,"pairs":[["a"]]})",
        R"({"domain":"d","level":5,"pairs":[["a",1]]})",
        R"({"domain":"d","level":5,"pairs":[],"time":"soon"})",
        R"({"domain":"d","level":5,"pairs":[],"time":4})"}) {
    EXPECT_FALSE(parsedMessage(text).ok()) << text;
  }
}

TEST(MomentText, ReadsWhatPeopleWrite) {
  ::setenv("TZ", "UTC0", 1);
  ::tzset();
  constexpr std::int64_t kNow = 1'700'000'000;  // 2023-11-14 22:13:20
  const std::pair<const char*, std::optional<std::int64_t>> cases[] = {
      {"2023-11-14", 1'699'920'000},
      {"2023-11-14 22:13", 1'699'999'980},
      {"2023-11-14 22:13:20", kNow},
      {"2023-11-14T22:13:20Z", kNow},
      {"today", 1'699'920'000},
      {"0s", kNow},
      {"45min", kNow - 2700},
      {"12h", kNow - 43200},
      {"3d", kNow - 259200},
      {"2w", kNow - 1209600},
      {"", std::nullopt},
      {"3", std::nullopt},
      {"-3d", std::nullopt},
      {"3 days", std::nullopt},
      {"99999999999d", std::nullopt},
      {"2023-02-30", std::nullopt},
      {"2023-13-01", std::nullopt},
      {"2023-11-14 22:13:20 and more", std::nullopt},
  };
  for (const auto& [text, moment] : cases) EXPECT_EQ(momentOf(text, kNow), moment) << text;
}

}  // namespace
}  // namespace norvex
