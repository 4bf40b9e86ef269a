// The two operations that keep exact figures on the machine.

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdint>
#include <cstdlib>
#include <random>
#include <sstream>
#include <string>
#include <vector>

#include "GoldenFile.h"
#include "results/NVXScannerResults.h"

namespace norvex {
namespace {

// Holds exact products of 64-bit numbers.
__extension__ using Wide = unsigned __int128;

constexpr std::uint64_t kTenTo15 = 1'000'000'000'000'000;
constexpr std::uint64_t kTenTo18 = 1'000'000'000'000'000'000;
constexpr std::uint64_t kTenTo19 = 10 * kTenTo18;
// Up to here every whole number is a double.
constexpr std::uint64_t kTwoTo53 = std::uint64_t{1} << 53;
constexpr const char* kBelowZero = "-93024035966911365120";

std::string sizeText(std::uint64_t size) {
  return NVXScannerResults::bucketedStringFromSize(size);
}

std::string countText(std::uint64_t count) {
  return NVXScannerResults::bucketedStringFromCount(count);
}

// `count` numbers from 2 to `below` - 1 of all orders of magnitude, the same on every run.
std::vector<std::uint64_t> numbersOfAllSizes(std::size_t count, std::uint64_t below) {
  std::mt19937_64 random(20'11);
  std::uniform_real_distribution<double> bits(1, std::log2(static_cast<double>(below)));
  std::vector<std::uint64_t> numbers;
  while (numbers.size() < count) {
    const auto number = static_cast<std::uint64_t>(std::exp2(bits(random)));
    if (number >= 2 && number < below) numbers.push_back(number);
  }
  return numbers;
}

struct Example {
  std::uint64_t value;
  const char* sizeText;
  const char* countText;
};

class BucketedValue : public testing::TestWithParam<Example> {};

TEST_P(BucketedValue, HasTheExpectedTexts) {
  EXPECT_EQ(sizeText(GetParam().value), GetParam().sizeText);
  EXPECT_EQ(countText(GetParam().value), GetParam().countText);
}

// clang-format off
constexpr Example kExamples[] = {
    {0,                       "0",                      "0"},
    {1,                       "0",                      "1"},
    {2,                       "2",                      "2"},
    {7,                       "8",                      "7"},
    {9,                       "10",                     "9"},
    {10,                      "10",                     "10"},
    {11,                      "13",                     "11"},
    {13,                      "16",                     "13"},
    {99,                      "101",                    "99"},
    {100,                     "101",                    "100"},
    {101,                     "126",                    "100"},
    {125,                     "126",                    "130"},
    {126,                     "126",                    "130"},
    {127,                     "159",                    "130"},
    {999,                     "1009",                   "1000"},
    {1000,                    "1009",                   "1000"},
    {1001,                    "1260",                   "1000"},
    {1050,                    "1260",                   "1100"},
    {1260,                    "1260",                   "1300"},
    {1261,                    "1588",                   "1300"},
    {12345,                   "12600",                  "12000"},
    {123456789,               "126000000",              "120000000"},
    {kTenTo15,                "1008568618886950",       "1000000000000000"},
    {kTenTo18,                "1008568618886950016",    "1000000000000000000"},
    {9 * kTenTo18,            "10085686188869500928",   "8999999999999998976"},
    {kTenTo19,                "10085686188869500928",   "10000000000000000000"},
    {std::uint64_t{1} << 63,  "10085686188869500928",   "9199999999999998976"},
    {~std::uint64_t{0},       "-93024035966911365120",  "17999999999999997952"},
};
// clang-format on

INSTANTIATE_TEST_SUITE_P(Examples, BucketedValue, testing::ValuesIn(kExamples),
                         [](const auto& example) { return "Of" + std::to_string(example.param.value); });

// Worked out by another program, in decimal arithmetic and with correctly rounded logarithms: both ends of
// every bucket, halves and powers of ten of all orders of magnitude, and numbers in between. A line is the
// value, its text as a size and its text as a count.
TEST(ValueBucketing, AgreesWithTheReferenceFile) {
  std::string texts;
  std::istringstream lines(readGolden("bucketing.txt"));
  for (std::string line; std::getline(lines, line);) {
    const std::uint64_t value = std::stoull(line);
    texts += std::to_string(value) + " " + sizeText(value) + " " + countText(value) + "\n";
  }
  EXPECT_EQ(readGolden("bucketing.txt"), texts);
}

// The bucketing takes its powers of ten from std::pow, which the standard does not require to be this good.
TEST(ValueBucketing, HasTheNearestPowersOfTenFromTheLibrary) {
  for (int exponent = -18; exponent <= 19; ++exponent) {
    const double nearest = std::strtod(("1e" + std::to_string(exponent)).c_str(), nullptr);
    EXPECT_EQ(std::pow(10.0, exponent), nearest) << exponent;
  }
}

TEST(ValueBucketing, NeverTellsLessThanTheSizeItself) {
  for (const std::uint64_t size : numbersOfAllSizes(20'000, kTwoTo53)) {
    EXPECT_GE(std::stoull(sizeText(size)), size);
  }
}

TEST(ValueBucketing, NeverTellsMoreThanTheSizeAndAQuarterOfIt) {
  for (const std::uint64_t size : numbersOfAllSizes(20'000, kTenTo19)) {
    const double told = std::strtod(sizeText(size).c_str(), nullptr);
    EXPECT_LE(told, 1.26001 * static_cast<double>(size) + 0.5) << size;
  }
}

TEST(ValueBucketing, NeverTellsALargerSizeAsASmallerOne) {
  std::vector<std::uint64_t> sizes = numbersOfAllSizes(20'000, kTenTo19);
  std::ranges::sort(sizes);
  std::uint64_t before = 0;
  for (const std::uint64_t size : sizes) {
    const std::uint64_t told = std::stoull(sizeText(size));
    EXPECT_GE(told, before) << size;
    before = told;
  }
}

// The buckets in whole numbers only.
struct ExactBucket {
  std::string text;
  // The size is the bound itself. The last bit of a double decides then whether it is still in the bucket.
  bool isBound;
};

ExactBucket exactBucket(std::uint64_t size) {
  // In units of 10^-14.
  constexpr std::array<std::uint64_t, 10> kBounds = {
      126'000'000'000'000, 158'760'000'000'000,  200'037'600'000'000, 252'047'376'000'000,
      317'579'693'760'000, 400'150'414'137'600,  504'189'521'813'376, 635'278'797'484'854,
      800'451'284'830'916, 1'008'568'618'886'950};
  constexpr Wide kUnit = 100'000'000'000'000;
  std::uint64_t decade = 1;
  while (decade * 10 < size) decade *= 10;
  const Wide scaledSize = Wide{size} * kUnit;
  const auto bound =
      std::ranges::find_if(kBounds, [&](std::uint64_t b) { return Wide{b} * decade >= scaledSize; });
  const Wide scaledBound = Wide{*bound} * decade;
  const auto whole = static_cast<std::uint64_t>(scaledBound / kUnit);
  const Wide twiceTheRest = 2 * (scaledBound % kUnit);
  const bool roundsUp = twiceTheRest > kUnit || (twiceTheRest == kUnit && whole % 2 == 1);
  return {std::to_string(whole + (roundsUp ? 1 : 0)), scaledBound == scaledSize};
}

TEST(ValueBucketing, FindsTheBucketsOfExactArithmetic) {
  std::vector<std::uint64_t> sizes = numbersOfAllSizes(20'000, kTenTo15);
  for (std::uint64_t size = 2; size <= 20'000; ++size) sizes.push_back(size);
  for (const std::uint64_t size : sizes) {
    const ExactBucket bucket = exactBucket(size);
    if (bucket.isBound) continue;
    EXPECT_EQ(sizeText(size), bucket.text) << size;
  }
}

// 1.26 * 100 is 126 in doubles too, 1.5876 * 10000 is a little less than 15876.
TEST(ValueBucketing, LetsDoublesDecideOnTheBoundItself) {
  ASSERT_TRUE(exactBucket(126).isBound);
  EXPECT_EQ(sizeText(126), "126");
  ASSERT_TRUE(exactBucket(15876).isBound);
  EXPECT_EQ(sizeText(15876), "20004");
}

// Two leading digits, a half rounded up, in whole numbers only.
std::string exactCountText(std::uint64_t count) {
  std::uint64_t unit = 1;
  while (unit * 100 < count) unit *= 10;
  return std::to_string((count + unit / 2) / unit * unit);
}

TEST(ValueBucketing, RoundsCountsAsExactArithmeticDoes) {
  for (std::uint64_t count = 1; count <= 20'000; ++count) {
    EXPECT_EQ(countText(count), exactCountText(count)) << count;
  }
  for (const std::uint64_t count : numbersOfAllSizes(20'000, kTenTo15)) {
    EXPECT_EQ(countText(count), exactCountText(count)) << count;
  }
}

TEST(ValueBucketing, TellsCountsUpToOneHundredAsTheyAre) {
  for (std::uint64_t count = 0; count <= 100; ++count) EXPECT_EQ(countText(count), std::to_string(count));
}

TEST(ValueBucketing, KeepsCountsThatArePowersOfTen) {
  for (std::uint64_t power = 1; power <= kTenTo18; power *= 10)
    EXPECT_EQ(countText(power), std::to_string(power));
}

TEST(ValueBucketing, PutsPowersOfTenIntoTheTopBucketOfTheDecadeBelow) {
  for (std::uint64_t power = 10; power <= kTenTo15; power *= 10) {
    EXPECT_EQ(sizeText(power), exactBucket(power).text) << power;
    EXPECT_EQ(sizeText(power), sizeText(power - power / 10)) << power;
    EXPECT_NE(sizeText(power), sizeText(power + power / 10)) << power;
  }
}

TEST(ValueBucketing, HasOneFigureForAllSizesAboveTenToThe19) {
  EXPECT_NE(sizeText(kTenTo19 + 30'000), kBelowZero);
  const std::uint64_t above[] = {kTenTo19 + 60'000, kTenTo19 + kTenTo18, ~std::uint64_t{0} - 1,
                                 ~std::uint64_t{0}};
  for (const std::uint64_t size : above) EXPECT_EQ(sizeText(size), kBelowZero) << size;
}

}  // namespace
}  // namespace norvex
