// The record as lines for people.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <sstream>
#include <string>
#include <vector>

#include "GoldenFile.h"
#include "RecordFields.h"
#include "results/SummaryTable.h"
#include "tests/support/TestPlatform.h"

namespace norvex {
namespace {

using testing::AnyOf;
using testing::Contains;
using testing::EndsWith;
using testing::IsEmpty;
using testing::SizeIs;

std::vector<std::string> linesOf(const std::string& text) {
  std::vector<std::string> lines;
  std::istringstream stream(text);
  for (std::string line; std::getline(stream, line);) lines.push_back(line);
  return lines;
}

std::string summaryOf(const NVXScannerResults& record) {
  const TestPlatform world;
  return record.description();
}

TEST(Summary, ShowsEveryFigureExactlyInItsLine) {
  expectGolden("summary.txt", summaryOf(fixedRecord()));
}

TEST(Summary, HasEightyValueLinesAndTwelveEmptyOnesForEveryRecord) {
  for (const NVXScannerResults& record : {NVXScannerResults(), fixedRecord()}) {
    const std::string text = summaryOf(record);
    EXPECT_THAT(text, EndsWith("\n"));
    const std::vector<std::string> lines = linesOf(text);
    EXPECT_THAT(lines, SizeIs(92));
    EXPECT_EQ(std::ranges::count(lines, ""), 12);
  }
}

TEST(Summary, ShowsZerosOffAndNoModelForAnEmptyRecord) {
  std::vector<std::string> lines = linesOf(summaryOf(NVXScannerResults()));
  ASSERT_THAT(lines, SizeIs(92));
  EXPECT_EQ(lines[0], "Hardware Model Identifier: (null)");
  EXPECT_EQ(lines[69], "Chronel Automatic Backups: Off");
  EXPECT_EQ(lines[70], "Number of Chronel Backup Destinations: 0");
  EXPECT_EQ(lines[71], "Chronel System Files Skipped: Off");
  lines.erase(lines.begin());
  for (const std::string& line : lines) {
    EXPECT_THAT(line, AnyOf(IsEmpty(), EndsWith(": 0 bytes"), EndsWith(": 0"), EndsWith(": Off")));
  }
}

TEST(Summary, ShowsAnEmptyModelAsEmptyAndNotAsAbsent) {
  NVXScannerResults record;
  record.setHardwareModelIdentifier(std::make_shared<const std::string>());
  EXPECT_EQ(linesOf(summaryOf(record)).front(), "Hardware Model Identifier: ");
}

TEST(Summary, ShowsTheModelUnchanged) {
  NVXScannerResults record;
  record.setHardwareModelIdentifier(std::make_shared<const std::string>("100%@ %s \xc3\xa9"));
  EXPECT_EQ(linesOf(summaryOf(record)).front(), "Hardware Model Identifier: 100%@ %s \xc3\xa9");
}

TEST(Summary, ReadsTheNumberOfDestinationsAsSignedAndAllOtherCountsAsUnsigned) {
  NVXScannerResults record;
  record.setNumberOfBackupDestinations(~std::uint64_t{0});
  record.setAllDisksTotalDirectoriesCount(~std::uint64_t{0});
  const std::vector<std::string> lines = linesOf(summaryOf(record));
  EXPECT_THAT(lines, Contains("Number of Chronel Backup Destinations: -1"));
  EXPECT_THAT(lines, Contains("All Disks Total Folders Count: 18446744073709551615"));
}

TEST(Summary, ShowsEachSettingInItsOwnLine) {
  NVXScannerResults record;
  record.setChronelSystemFilesSkipped(true);
  const std::vector<std::string> lines = linesOf(summaryOf(record));
  EXPECT_THAT(lines, Contains("Chronel Automatic Backups: Off"));
  EXPECT_THAT(lines, Contains("Chronel System Files Skipped: On"));
}

// Two fields have no line of their own: they are derived from others that have.
TEST(Summary, ChangesOneLineWhenAFieldChangesAndNoneForTheUserContent) {
  const std::vector<std::string> before = linesOf(summaryOf(NVXScannerResults()));
  for (const RecordField& field : recordFields()) {
    NVXScannerResults record;
    field.set(record, "1");
    const std::vector<std::string> after = linesOf(summaryOf(record));
    ASSERT_EQ(after.size(), before.size());
    int changed = 0;
    for (std::size_t line = 0; line < after.size(); ++line) changed += after[line] != before[line] ? 1 : 0;
    const bool isDerived = field.name == "userContentSize" || field.name == "startupDiskUserContentSize";
    EXPECT_EQ(changed, isDerived ? 0 : 1) << field.name;
  }
}

TEST(Summary, IsReportedNowhere) {
  const TestPlatform world;
  EXPECT_FALSE(fixedRecord().description().empty());
  EXPECT_THAT(world.calls.all(), IsEmpty());
}

TEST(SummaryTable, GivesTheLinesOneByOne) {
  const TestPlatform world;
  const NVXScannerResults record = fixedRecord();
  std::string text;
  for (const SummaryRow& row : summaryRows()) text += summaryLine(row, record);
  EXPECT_EQ(text, record.description());
}

}  // namespace
}  // namespace norvex
