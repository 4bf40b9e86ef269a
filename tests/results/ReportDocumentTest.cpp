// docs/report.md promises people what is in a report; it must name every key, and nothing else.

#include <gtest/gtest.h>

#include <cstdint>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

#include "RecordFields.h"
#include "results/ReportTables.h"

namespace norvex {
namespace {

// The lines of the document; empty when it cannot be read.
std::vector<std::string> documentLines() {
  std::ifstream file(NORVEX_SOURCE_DIR "/docs/report.md");
  std::vector<std::string> lines;
  for (std::string line; std::getline(file, line);) lines.push_back(line);
  return lines;
}

std::string trimmed(const std::string& text) {
  const auto first = text.find_first_not_of(' ');
  return first == std::string::npos ? "" : text.substr(first, text.find_last_not_of(' ') - first + 1);
}

// The cells of a table's line that starts with a number; none for any other line.
std::vector<std::string> numberedCells(const std::string& line) {
  std::vector<std::string> cells;
  if (!line.starts_with("| ") || line.find_first_of("0123456789") != 2) return cells;
  std::istringstream stream(line.substr(1));
  for (std::string cell; std::getline(stream, cell, '|');) cells.push_back(trimmed(cell));
  return cells;
}

// How the document writes a row's encoding and fields.
std::string quoted(FieldGetter field) {
  return "`" + std::string(fieldName(field)) + "`";
}

struct Written {
  std::string fields;
  std::string encoding;
};

Written written(const encoding::Size& value) {
  return {quoted(value.field), "size"};
}
Written written(const encoding::Count& value) {
  return {quoted(value.field), "count"};
}
Written written(const encoding::Difference& value) {
  return {quoted(value.minuend) + " \u2212 " + quoted(value.subtrahend), "difference"};
}
Written written(const encoding::Boolean& value) {
  return {quoted(value.field), "boolean"};
}
Written written(const encoding::SignedDecimal& value) {
  return {quoted(value.field), "signed decimal"};
}
Written written(const encoding::Exact& value) {
  return {quoted(value.field), "exact"};
}

std::string messageHeading(const ReportMessage& message) {
  return "Domain `" + std::string(message.domain) + "`, level " + std::to_string(message.level) + ", on " +
         (message.onlyOnInternalInstalls ? "internal installations only" : "every machine") + ".\n";
}

// The columns of the document's tables that the program decides on.
std::string tablesOfTheProgram() {
  std::string text;
  for (const ReportMessage& message : reportMessages()) {
    text += messageHeading(message);
    for (std::size_t row = 0; row < message.rows.size(); ++row) {
      const auto& [key, value] = message.rows[row];
      const Written columns = std::visit([](const auto& v) { return written(v); }, value);
      text += std::to_string(row + 1) + " | `" + std::string(key) + "` | " + columns.fields + " | " +
              columns.encoding + "\n";
    }
  }
  return text;
}

constexpr std::size_t kColumns = 6;

std::string tablesOfTheDocument() {
  std::string text;
  for (const std::string& line : documentLines()) {
    if (line.starts_with("Domain ")) text += line + "\n";
    const std::vector<std::string> cells = numberedCells(line);
    if (cells.size() == kColumns)
      text += cells[0] + " | " + cells[1] + " | " + cells[2] + " | " + cells[3] + "\n";
  }
  return text;
}

TEST(ReportDocument, ListsEveryKeyWithItsFieldsAndEncodingInOrder) {
  EXPECT_EQ(tablesOfTheDocument(), tablesOfTheProgram());
}

TEST(ReportDocument, GivesEveryKeyAMeaningAndTheRightUnit) {
  std::size_t keys = 0;
  for (const std::string& line : documentLines()) {
    const std::vector<std::string> cells = numberedCells(line);
    if (cells.size() != kColumns) continue;
    ++keys;
    const std::string& encodingName = cells[3];
    const bool isSize =
        encodingName == "size" || encodingName == "difference" || cells[1].ends_with("folder_size`");
    EXPECT_EQ(cells[4] == "bytes", isSize) << line;
    EXPECT_FALSE(cells[4].empty()) << line;
    EXPECT_FALSE(cells[5].empty()) << line;
  }
  EXPECT_EQ(keys, 66U + 6U + 12U);
}

TEST(ReportDocument, ShowsExamplesAsTheyAre) {
  std::size_t examples = 0;
  for (const std::string& line : documentLines()) {
    const std::vector<std::string> cells = numberedCells(line);
    if (cells.size() != 3) continue;
    ++examples;
    const std::uint64_t value = std::stoull(cells[0]);
    EXPECT_EQ(cells[1], NVXScannerResults::bucketedStringFromSize(value)) << line;
    EXPECT_EQ(cells[2], NVXScannerResults::bucketedStringFromCount(value)) << line;
  }
  EXPECT_EQ(examples, 10U);
}

}  // namespace
}  // namespace norvex
