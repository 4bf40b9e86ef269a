// The record as a plain holder of 82 fields.

#include "results/NVXScannerResults.h"

#include <gtest/gtest.h>

#include <limits>
#include <memory>
#include <string>

#include "GoldenFile.h"
#include "RecordFields.h"

namespace norvex {
namespace {

constexpr auto kMax = std::numeric_limits<std::uint64_t>::max();

std::string allFields(const NVXScannerResults& record) {
  std::string text;
  for (const RecordField& field : recordFields()) {
    text += std::string(field.name) + "=" + fieldText(field, record) + "\n";
  }
  return text;
}

template <typename Getter>
std::size_t fieldsOfKind() {
  std::size_t count = 0;
  for (const RecordField& field : recordFields())
    count += std::holds_alternative<Getter>(field.getter) ? 1 : 0;
  return count;
}

TEST(NVXScannerResults, HasEightyTwoFieldsOfThreeKinds) {
  EXPECT_EQ(recordFields().size(), 82U);
  EXPECT_EQ(fieldsOfKind<TextGetter>(), 1U);
  EXPECT_EQ(fieldsOfKind<SettingGetter>(), 2U);
  EXPECT_EQ(fieldsOfKind<FigureGetter>(), 79U);
}

TEST(NVXScannerResults, StartsEmpty) {
  const NVXScannerResults record;
  EXPECT_EQ(record.hardwareModelIdentifier(), nullptr);
  for (const RecordField& field : recordFields()) {
    const bool isText = std::holds_alternative<TextGetter>(field.getter);
    EXPECT_EQ(fieldText(field, record), isText ? "(null)" : "0") << field.name;
  }
}

// Also holds the order of the fields, and that every setter stores into the field of its getter.
TEST(NVXScannerResults, GivesBackEveryFieldOfARecord) {
  EXPECT_EQ(allFields(fixedRecord()), readGolden("record.txt"));
}

TEST(NVXScannerResults, KeepsEachFieldApartFromAllOthers) {
  const std::string empty = allFields(NVXScannerResults());
  for (const RecordField& field : recordFields()) {
    const bool isText = std::holds_alternative<TextGetter>(field.getter);
    NVXScannerResults record;
    field.set(record, "1");
    std::string expected = empty;
    const std::string line = std::string(field.name) + "=";
    // Behind a line feed, since some names are the ends of others.
    const std::size_t at = ("\n" + expected).find("\n" + line) + line.size();
    expected.replace(at, isText ? 6 : 1, "1");
    EXPECT_EQ(allFields(record), expected) << field.name;
  }
}

TEST(NVXScannerResults, StoresTheLargestFigureAsItIs) {
  NVXScannerResults record;
  for (const RecordField& field : recordFields()) {
    if (!std::holds_alternative<FigureGetter>(field.getter)) continue;
    field.set(record, std::to_string(kMax));
    EXPECT_EQ(fieldText(field, record), std::to_string(kMax)) << field.name;
  }
}

TEST(NVXScannerResults, WrapsAroundWhenASumOverflows) {
  NVXScannerResults record;
  record.setTotalSize(kMax);
  record.setTotalSize(record.totalSize() + 2);
  EXPECT_EQ(record.totalSize(), 1U);
}

TEST(NVXScannerResults, SharesTheModelIdentifierAndDropsTheOneBefore) {
  NVXScannerResults record;
  const auto first = std::make_shared<const std::string>("first");
  record.setHardwareModelIdentifier(first);
  EXPECT_EQ(record.hardwareModelIdentifier(), first);
  EXPECT_EQ(first.use_count(), 2);
  record.setHardwareModelIdentifier(nullptr);
  EXPECT_EQ(record.hardwareModelIdentifier(), nullptr);
  EXPECT_EQ(first.use_count(), 1);
}

}  // namespace
}  // namespace norvex
