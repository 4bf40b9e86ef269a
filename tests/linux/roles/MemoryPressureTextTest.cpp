#include "platform/linux/MemoryPressureText.h"

#include <gtest/gtest.h>

#include "platform/linux/Base64.h"

namespace norvex {
namespace {

TEST(MemoryPressureText, TellsTheTotalsOfAPressureFile) {
  const std::optional<StallTotals> totals = stallTotalsIn(
      "some avg10=0.12 avg60=0.00 avg300=0.00 total=1234567\n"
      "full avg10=0.00 avg60=0.00 avg300=0.00 total=89\n");
  ASSERT_TRUE(totals);
  EXPECT_EQ(totals->some.count(), 1'234'567);
  EXPECT_EQ(totals->full.count(), 89);
}

TEST(MemoryPressureText, AFileThatIsNotThatHasNoTotals) {
  for (const char* text : {"", "some total=1\n", "full total=1\n", "some total=\nfull total=1\n",
                           "some\nfull\n", "some total=x\nfull total=1\n", "some total=-1\nfull total=1\n",
                           "some total=9223372036854775808\nfull total=1\n",
                           "some total=99999999999999999999\nfull total=1\n", "\n\n\n"}) {
    EXPECT_FALSE(stallTotalsIn(text)) << text;
  }
}

TEST(MemoryPressureText, TellsTheShareOfMemoryThatIsLeft) {
  struct Case {
    const char* text;
    std::optional<std::uint64_t> permille;
  };
  const Case cases[] = {
      {"MemTotal:       1000 kB\nMemFree: 1 kB\nMemAvailable:    99 kB\n", 99},
      {"MemTotal: 3000 kB\nMemAvailable: 1000 kB", 333},
      {"MemTotal: 1000 kB\nMemAvailable: 0 kB\n", 0},
      {"MemTotal: 0 kB\nMemAvailable: 0 kB\n", std::nullopt},
      {"MemTotal: 1000 kB\n", std::nullopt},
      {"MemAvailable: 1000 kB\n", std::nullopt},
      {"MemTotal: x kB\nMemAvailable: 1 kB\n", std::nullopt},
      {"MemTotal: 1 kB\nMemAvailable: 18446744073709551615 kB\n", std::nullopt},
      {"", std::nullopt},
  };
  for (const Case& row : cases) EXPECT_EQ(availablePermilleIn(row.text), row.permille) << row.text;
}

TEST(Base64, DecodesPaddedGroups) {
  struct Case {
    const char* text;
    std::optional<std::string> bytes;
  };
  const Case cases[] = {
      {"", ""},
      {"YQ==", "a"},
      {"YWI=", "ab"},
      {"YWJj", "abc"},
      {"c29tZSAyMDAwMDAgMjAwMDAwMAA=", std::string("some 200000 2000000\0", 20)},
      {"/+8A", std::string("\xff\xef\0", 3)},
      {"YQ", std::nullopt},
      {"Y===", std::nullopt},
      {"====", std::nullopt},
      {"YW=j", std::nullopt},
      {"YWJ\n", std::nullopt},
      {"YWJ-", std::nullopt},
  };
  for (const Case& row : cases) EXPECT_EQ(base64Decoded(row.text), row.bytes) << row.text;
}

}  // namespace
}  // namespace norvex
