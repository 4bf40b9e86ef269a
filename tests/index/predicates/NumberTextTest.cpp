#include "index/NumberText.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <string>
#include <vector>

namespace norvex {
namespace {

constexpr auto kLargest = std::numeric_limits<std::int64_t>::max();
constexpr auto kSmallest = std::numeric_limits<std::int64_t>::min();

TEST(NumberText, ReadsSignDigitsFractionAndExponent) {
  const std::vector<std::pair<std::string, PlainNumber>> rows{
      {"0", std::int64_t{0}},
      {"7", std::int64_t{7}},
      {"+7", std::int64_t{7}},
      {"-7", std::int64_t{-7}},
      {"007", std::int64_t{7}},
      {"9223372036854775807", kLargest},
      {"-9223372036854775808", kSmallest},
      {"9223372036854775808", 9223372036854775808.0},
      {"1.5", 1.5},
      {"+1.5", 1.5},
      {"-1.50", -1.5},
      {"2e9", 2e9},
      {"2E+9", 2e9},
      {"25e-1", 2.5},
      {"1.0", 1.0},
  };
  for (const auto& [text, number] : rows) {
    const auto read = numberFromText(text);
    ASSERT_TRUE(read.has_value()) << text;
    EXPECT_EQ(*read, number) << text;
  }
}

TEST(NumberText, ReadsNothingElse) {
  const std::vector<std::string> rows{"",      "+",      "-",      "+-1", " 1",    "1 ",
                                      "1.",    ".5",     "1e",     "1e+", "e5",    "1x",
                                      "0x10",  "inf",    "nan",    "1,5", "1.2.3", "1e5.0",
                                      "1e999", "-1e999", "1e-999", "--1", "1\n",   std::string("1\0", 2)};
  for (const auto& text : rows) EXPECT_FALSE(numberFromText(text).has_value()) << text;
}

TEST(NumberText, ComparesExactValues) {
  struct Row {
    PlainNumber left;
    PlainNumber right;
    std::partial_ordering order;
  };
  const auto less = std::partial_ordering::less;
  const auto equal = std::partial_ordering::equivalent;
  const std::vector<Row> rows{
      {std::int64_t{1}, std::int64_t{2}, less},
      {std::int64_t{1}, 1.0, equal},
      {std::int64_t{1}, 1.5, less},
      {std::int64_t{-2}, -1.5, less},
      {-1.5, std::int64_t{-1}, less},
      {0.0, -0.0, equal},
      // A double cannot tell these two whole numbers apart.
      {9007199254740992.0, std::int64_t{9007199254740993}, less},
      {kLargest, 9223372036854775808.0, less},
      {-9223372036854775808.0, kSmallest, equal},
      {-1e300, kSmallest, less},
      {kLargest, 1e300, less},
  };
  for (const auto& row : rows) {
    EXPECT_EQ(compareNumbers(row.left, row.right), row.order);
    EXPECT_EQ(compareNumbers(row.right, row.left), 0 <=> row.order);
  }
  EXPECT_EQ(compareNumbers(std::int64_t{1}, std::nan("")), std::partial_ordering::unordered);
}

}  // namespace
}  // namespace norvex
