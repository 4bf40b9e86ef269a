// What a record reports, to the last key.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <random>
#include <set>
#include <sstream>
#include <string>
#include <vector>

#include "GoldenFile.h"
#include "RecordFields.h"
#include "results/ReportTables.h"
#include "tests/support/TestPlatform.h"

namespace norvex {
namespace {

using testing::ElementsAre;
using testing::SizeIs;
using Message = InMemoryDiagnosticLog::Message;

constexpr const char* kBelowZero = "-93024035966911365120";

// The messages that the record sends.
std::vector<Message> messagesOf(const NVXScannerResults& record, bool onInternalInstall) {
  TestPlatform world;
  world.installation.isInternal = onInternalInstall;
  record.logToWendal();
  return world.diagnosticLog.messages;
}

std::string textOf(const Message& message) {
  std::string text = "domain=" + message.domain + "\nlevel=" + std::to_string(message.level) + "\n";
  for (const auto& [key, value] : message.pairs) text += key + "=" + value + "\n";
  return text;
}

// The text that the record sends for the key, or "absent".
std::string reported(const NVXScannerResults& record, const std::string& key) {
  for (const Message& message : messagesOf(record, true)) {
    for (const auto& pair : message.pairs) {
      if (pair.first == "com.brixo.message." + key) return pair.second;
    }
  }
  return "absent";
}

TEST(DiagnosticReport, SendsThreeMessagesOnAnInternalInstallation) {
  const std::vector<Message> messages = messagesOf(fixedRecord(), true);
  ASSERT_THAT(messages, SizeIs(3));
  expectGolden("sizes-message.txt", textOf(messages[0]));
  expectGolden("counts-message.txt", textOf(messages[1]));
  expectGolden("folder-message.txt", textOf(messages[2]));
}

TEST(DiagnosticReport, SendsTheFirstTwoMessagesAloneElsewhere) {
  const std::vector<Message> messages = messagesOf(fixedRecord(), false);
  ASSERT_THAT(messages, SizeIs(2));
  expectGolden("sizes-message.txt", textOf(messages[0]));
  expectGolden("counts-message.txt", textOf(messages[1]));
}

TEST(DiagnosticReport, AsksForTheKindOfInstallationBetweenTheSecondAndTheThirdMessage) {
  TestPlatform world;
  world.installation.isInternal = true;
  NVXScannerResults().logToWendal();
  EXPECT_THAT(world.calls.all(),
              ElementsAre("logWithKeys com.brixo.norvex.run2", "logWithKeys com.brixo.norvex.filecounts.run3",
                          "isInternalInstall", "logWithKeys com.brixo.norvex.directoryinfo.run4"));
}

TEST(DiagnosticReport, AsksForTheKindOfInstallationOnceWhenItIsNotInternal) {
  TestPlatform world;
  NVXScannerResults().logToWendal();
  EXPECT_THAT(world.calls.all(),
              ElementsAre("logWithKeys com.brixo.norvex.run2", "logWithKeys com.brixo.norvex.filecounts.run3",
                          "isInternalInstall"));
}

TEST(DiagnosticReport, SendsTheSameAgainWhenAskedAgain) {
  TestPlatform world;
  const NVXScannerResults record = fixedRecord();
  record.logToWendal();
  record.logToWendal();
  const std::vector<Message>& messages = world.diagnosticLog.messages;
  ASSERT_THAT(messages, SizeIs(4));
  EXPECT_EQ(textOf(messages[0]), textOf(messages[2]));
  EXPECT_EQ(textOf(messages[1]), textOf(messages[3]));
}

TEST(DiagnosticReport, SendsZeroForEveryKeyOfAnEmptyRecord) {
  const std::vector<Message> messages = messagesOf(NVXScannerResults(), true);
  ASSERT_THAT(messages, SizeIs(3));
  EXPECT_THAT(messages[0].pairs, SizeIs(66));
  EXPECT_THAT(messages[1].pairs, SizeIs(6));
  EXPECT_THAT(messages[2].pairs, SizeIs(12));
  for (const Message& message : messages) {
    for (const auto& [key, value] : message.pairs) EXPECT_EQ(value, "0") << key;
  }
}

// Which keys change when one field alone does. The file says which may.
TEST(DiagnosticReport, FeedsEachKeyFromItsOwnFieldsAndNoOther) {
  const std::vector<Message> before = messagesOf(NVXScannerResults(), true);
  std::string feeds;
  for (const RecordField& field : recordFields()) {
    NVXScannerResults record;
    const bool isSetting = std::holds_alternative<SettingGetter>(field.getter);
    field.set(record, isSetting ? "1" : "123456789");
    const std::vector<Message> after = messagesOf(record, true);
    std::string keys;
    for (std::size_t m = 0; m < after.size(); ++m) {
      for (std::size_t p = 0; p < after[m].pairs.size(); ++p) {
        if (after[m].pairs[p] != before[m].pairs[p])
          keys += (keys.empty() ? "" : ",") + after[m].pairs[p].first;
      }
    }
    feeds += std::string(field.name) + "=" + keys + "\n";
  }
  expectGolden("keys-of-fields.txt", feeds);
}

struct DifferenceCase {
  const char* key;
  void (NVXScannerResults::*setMinuend)(std::uint64_t);
  void (NVXScannerResults::*setSubtrahend)(std::uint64_t);
};

class ReportedDifference : public testing::TestWithParam<DifferenceCase> {
 protected:
  static std::string of(std::uint64_t minuend, std::uint64_t subtrahend) {
    NVXScannerResults record;
    (record.*GetParam().setMinuend)(minuend);
    (record.*GetParam().setSubtrahend)(subtrahend);
    return reported(record, GetParam().key);
  }
};

TEST_P(ReportedDifference, IsTheBucketOfTheDifference) {
  EXPECT_EQ(of(5000, 1000), "4002");
  EXPECT_EQ(of(5000, 5000), "0");
}

TEST_P(ReportedDifference, WrapsAroundBelowZeroAndIsNotClamped) {
  EXPECT_EQ(of(5000, 6000), kBelowZero);
  EXPECT_EQ(of(0, 1), kBelowZero);
  // So far below zero that it is back among ordinary sizes.
  EXPECT_EQ(of(0, ~std::uint64_t{0} - 99), "101");
}

using R = NVXScannerResults;
constexpr DifferenceCase kDifferences[] = {
    {"user_apps_size", &R::setAppsSize, &R::setDovecartContentSize},
    {"user_music_size", &R::setMusicSize, &R::setSonpixStoreMusicSize},
    {"user_movies_size", &R::setMoviesSize, &R::setSonpixStoreMoviesSize},
};
INSTANTIATE_TEST_SUITE_P(Keys, ReportedDifference, testing::ValuesIn(kDifferences),
                         [](const auto& difference) { return std::string(difference.param.key); });

TEST(DiagnosticReport, TellsAUserContentBelowZeroAsItWasStored) {
  NVXScannerResults record;
  record.setUserContentSize(~std::uint64_t{0});
  EXPECT_EQ(reported(record, "user_content_size"), kBelowZero);
}

TEST(DiagnosticReport, TellsTheNumberOfDestinationsUnroundedAndSigned) {
  const std::pair<std::uint64_t, const char*> cases[] = {
      {2, "2"},
      {123456789, "123456789"},
      {(std::uint64_t{1} << 63) - 1, "9223372036854775807"},
      {std::uint64_t{1} << 63, "-9223372036854775808"},
      {~std::uint64_t{0}, "-1"},
  };
  for (const auto& [destinations, text] : cases) {
    NVXScannerResults record;
    record.setNumberOfBackupDestinations(destinations);
    EXPECT_EQ(reported(record, "chronel_destinations_count"), text);
  }
}

TEST(DiagnosticReport, TellsTheSettingsAsOneAndZero) {
  NVXScannerResults record;
  record.setChronelSystemFilesSkipped(true);
  EXPECT_EQ(reported(record, "chronel_auto_backup_enabled"), "0");
  EXPECT_EQ(reported(record, "chronel_system_files_skipped"), "1");
}

TEST(DiagnosticReport, TellsFolderFiguresExactlyAndUnsigned) {
  NVXScannerResults record;
  record.setDesktopFolderSize(123456789);
  record.setDocumentsFileCount(~std::uint64_t{0});
  EXPECT_EQ(reported(record, "desktop_folder_size"), "123456789");
  EXPECT_EQ(reported(record, "documents_file_count"), "18446744073709551615");
}

TEST(DiagnosticReport, NeverSendsTheHardwareModel) {
  const NVXScannerResults record = fixedRecord();
  for (const Message& message : messagesOf(record, true)) {
    EXPECT_EQ(textOf(message).find(*record.hardwareModelIdentifier()), std::string::npos);
  }
}

// A record whose figures are of all orders of magnitude.
NVXScannerResults randomRecord(std::mt19937_64& random) {
  NVXScannerResults record;
  for (const RecordField& field : recordFields()) {
    if (!std::holds_alternative<FigureGetter>(field.getter)) continue;
    field.set(record, std::to_string(random() >> (random() % 64)));
  }
  return record;
}

// Every text that a bucketed size can have.
std::set<std::string> bucketTexts() {
  std::set<std::string> texts;
  std::istringstream lines(readGolden("bucketing.txt"));
  for (std::string value, size, count; lines >> value >> size >> count;) texts.insert(size);
  return texts;
}

bool isCoarseCount(const std::string& text) {
  const double count = std::stod(text);
  const double unit = count < 100 ? 1 : std::pow(10.0, std::floor(std::log10(count)) - 1);
  // Large counts miss the even figure by a unit in the last place of a double.
  return std::abs(count - std::round(count / unit) * unit) <= count * 1e-15;
}

// A row of the first two messages, and whether it may carry the text.
bool isAllowed(const ReportRow& row, const std::string& text, const std::set<std::string>& buckets) {
  if (std::holds_alternative<encoding::Size>(row.value)) return buckets.contains(text);
  if (std::holds_alternative<encoding::Difference>(row.value)) return buckets.contains(text);
  if (std::holds_alternative<encoding::Count>(row.value)) return isCoarseCount(text);
  if (std::holds_alternative<encoding::Boolean>(row.value)) return text == "0" || text == "1";
  return row.key == "com.brixo.message.chronel_destinations_count";
}

TEST(DiagnosticReport, LetsNoExactSizeOrCountIntoTheFirstTwoMessages) {
  const std::set<std::string> buckets = bucketTexts();
  std::mt19937_64 random(7);
  for (int run = 0; run < 200; ++run) {
    const std::vector<Message> messages = messagesOf(randomRecord(random), false);
    ASSERT_THAT(messages, SizeIs(2));
    for (std::size_t m = 0; m < 2; ++m) {
      const auto& rows = reportMessages()[m].rows;
      for (std::size_t r = 0; r < rows.size(); ++r) {
        const auto& [key, text] = messages[m].pairs[r];
        EXPECT_TRUE(isAllowed(rows[r], text, buckets)) << key << "=" << text;
      }
    }
  }
}

TEST(ReportTables, NameEveryKeyOnce) {
  std::set<std::string_view> keys;
  for (const ReportMessage& message : reportMessages()) {
    for (const ReportRow& row : message.rows) EXPECT_TRUE(keys.insert(row.key).second) << row.key;
  }
  EXPECT_THAT(keys, SizeIs(66 + 6 + 12));
}

TEST(ReportTables, KeepTheThirdMessageAloneToInternalInstallations) {
  std::vector<bool> onlyInternal;
  for (const ReportMessage& message : reportMessages())
    onlyInternal.push_back(message.onlyOnInternalInstalls);
  EXPECT_THAT(onlyInternal, ElementsAre(false, false, true));
}

// What another program shows beside each text.
TEST(ReportTables, GiveTheFigureBehindEachText) {
  NVXScannerResults record;
  record.setTotalSize(123456789);
  record.setAppsSize(5000);
  record.setDovecartContentSize(6000);
  record.setChronelAutomaticBackupsEnabled(true);
  const auto& rows = reportMessages()[0].rows;
  EXPECT_EQ(exactFigure(rows[0], record), ExactFigure(std::uint64_t{123456789}));
  EXPECT_EQ(reportedText(rows[0], record), "126000000");
  EXPECT_EQ(exactFigure(rows[13], record), ExactFigure(~std::uint64_t{0} - 999));
  EXPECT_EQ(reportedText(rows[13], record), kBelowZero);
  EXPECT_EQ(exactFigure(rows[17], record), ExactFigure(true));
  EXPECT_EQ(reportedText(rows[17], record), "1");
}

}  // namespace
}  // namespace norvex
