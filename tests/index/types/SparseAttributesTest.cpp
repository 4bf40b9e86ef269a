#include "index/SparseAttributes.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <limits>
#include <string>

namespace norvex {
namespace {

using namespace std::string_view_literals;
using testing::VariantWith;

struct NameCase {
  std::string_view extendedAttribute;
  std::optional<std::string_view> name;
};

TEST(SparseAttributes, AreTheTwoFamiliesOfTheUsersNamespace) {
  const NameCase cases[] = {
      {"user.kMDItemPurchaseDate", "kMDItemPurchaseDate"},
      {"user.kMDItemDovecartHasReceipt", "kMDItemDovecartHasReceipt"},
      {"user.com_brixo_backup_excludeItem", "com_brixo_backup_excludeItem"},
      {"user.kMDItemX", "kMDItemX"},
      {"user.kMDItem", {}},
      {"user.com_brixo_", {}},
      {"user.kmditemPurchaseDate", {}},
      {"user.com_other_x", {}},
      {"user.xdg.robots.backup", {}},
      {"kMDItemPurchaseDate", {}},
      {"trusted.kMDItemPurchaseDate", {}},
      {"user.user.kMDItemPurchaseDate", {}},
      {"", {}},
      {"user.", {}},
  };
  for (const NameCase& each : cases) {
    EXPECT_EQ(sparseAttributeName(each.extendedAttribute), each.name) << each.extendedAttribute;
  }
}

TEST(SparseAttributes, CannotReplaceWhatTheIndexItselfGives) {
  for (const std::string_view attribute :
       {"user.kMDItemPath", "user.kMDItemFSName", "user.kMDItemFSSize", "user.kMDItemFSContentChangeDate",
        "user.kMDItemContentType", "user.kMDItemContentTypeTree", "user.kMDItemKind",
        "user.kMDStoreLastHealthCheck", "user.kMDStoreAccumulatedSizes"}) {
    EXPECT_EQ(sparseAttributeName(attribute), std::nullopt) << attribute;
  }
  // Longer names are others.
  EXPECT_EQ(sparseAttributeName("user.kMDItemPathOrigin"), "kMDItemPathOrigin");
}

struct IntegerCase {
  std::string_view value;
  std::int64_t number;
};

TEST(SparseAttributes, WholeNumbersThatFitAreIntegers) {
  constexpr IntegerCase cases[] = {
      {"0", 0},
      {"1", 1},
      {"+1", 1},
      {"-1", -1},
      {"-0", 0},
      {"007", 7},
      {"1\n", 1},
      {"1\0"sv, 1},
      {"9223372036854775807", std::numeric_limits<std::int64_t>::max()},
      {"-9223372036854775808", std::numeric_limits<std::int64_t>::min()},
      {"+9223372036854775807", std::numeric_limits<std::int64_t>::max()},
  };
  for (const IntegerCase& each : cases) {
    EXPECT_THAT(parseSparseValue(each.value), VariantWith<std::int64_t>(each.number)) << each.value;
  }
}

struct DoubleCase {
  std::string_view value;
  double number;
};

TEST(SparseAttributes, OtherNumbersAreDoubles) {
  constexpr DoubleCase cases[] = {
      {"0.5", 0.5},
      {"-0.5", -0.5},
      {"+0.5", 0.5},
      {"1.0", 1.0},
      {"1.25\n", 1.25},
      {"1e3", 1000.0},
      {"1E3", 1000.0},
      {"1e+3", 1000.0},
      {"1e-3", 0.001},
      {"-1.5e2", -150.0},
      {"1.5E-2", 0.015},
      {"9223372036854775808", 9223372036854775808.0},
      {"-9223372036854775809", -9223372036854775808.0},
      {"100000000000000000000", 1e20},
      {"1e308", 1e308},
  };
  for (const DoubleCase& each : cases) {
    EXPECT_THAT(parseSparseValue(each.value), VariantWith<double>(each.number)) << each.value;
  }
}

struct TextCase {
  std::string_view value;
  std::string_view text;
};

TEST(SparseAttributes, AllElseIsTextByteForByte) {
  constexpr TextCase cases[] = {
      {"", ""},
      {"\n", ""},
      {"\0"sv, ""},
      {"\n\n", "\n"},
      {"1\n\n", "1\n"},
      {"1\n\0"sv, "1\n"},
      {"1\0\n"sv, "1\0"sv},
      {"1\r\n", "1\r"},
      {" 1", " 1"},
      {"1 ", "1 "},
      {"+", "+"},
      {"-", "-"},
      {"+-1", "+-1"},
      {"--1", "--1"},
      {".5", ".5"},
      {"5.", "5."},
      {"-.5", "-.5"},
      {".", "."},
      {"1.e3", "1.e3"},
      {"e3", "e3"},
      {"1e", "1e"},
      {"1e+", "1e+"},
      {"1e1.5", "1e1.5"},
      {"1.2.3", "1.2.3"},
      {"1,5", "1,5"},
      {"1_000", "1_000"},
      {"0x10", "0x10"},
      {"1f", "1f"},
      {"inf", "inf"},
      {"-inf", "-inf"},
      {"nan", "nan"},
      {"1e999", "1e999"},
      {"-1e999", "-1e999"},
      {"\xD9\xA1", "\xD9\xA1"},
      {"com.brixo.backupd", "com.brixo.backupd"},
      {"\xFF\0x"sv, "\xFF\0x"sv},
  };
  for (const TextCase& each : cases) {
    EXPECT_THAT(parseSparseValue(each.value), VariantWith<std::string>(std::string(each.text))) << each.value;
  }
}

TEST(SparseAttributes, LongDigitsAreReadWhole) {
  EXPECT_THAT(parseSparseValue(std::string(65536, '0') + "1"), VariantWith<std::int64_t>(1));
  EXPECT_THAT(parseSparseValue("0." + std::string(300, '0') + "5"), VariantWith<double>(5e-301));
}

}  // namespace
}  // namespace norvex
