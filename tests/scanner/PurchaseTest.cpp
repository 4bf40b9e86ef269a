#include <gmock/gmock.h>

#include "scanner/NVXScanner.h"
#include "tests/support/TestPlatform.h"

namespace norvex {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;

constexpr std::uint32_t kPurd = 0x70757264;

TEST(Purchase, IsToldByThePurchaseDateItem) {
  const struct {
    const char* claim;
    std::vector<MediaItemKey> keys;
    bool purchased;
  } rows[] = {
      {"the item alone", {kPurd}, true},
      {"the item among others",
       {std::uint32_t{0xA96E616D}, "free-form", kPurd, std::uint32_t{0x61415254}},
       true},
      {"other items only", {std::uint32_t{0x61415254}, std::uint32_t{0x63707274}}, false},
      {"no items", {}, false},
      {"a text key of the same letters", {"purd"}, false},
      {"another case", {std::uint32_t{0x50555244}}, false},
      {"only a beginning", {std::uint32_t{0x707572}}, false},
      {"bytes in the other order", {std::uint32_t{0x64727570}}, false},
  };
  for (const auto& row : rows) {
    TestPlatform world;
    world.mediaMetadataReader.keysOfFile["/m.m4a"] = row.keys;
    EXPECT_EQ(NVXScanner().isPurchasedFromSonpixStore(Location::file("/m.m4a")), row.purchased) << row.claim;
    EXPECT_THAT(world.systemLog.lines, IsEmpty()) << row.claim;
  }
}

TEST(Purchase, IsFalseSilentlyForWhatIsNoMediaFile) {
  TestPlatform world;
  EXPECT_FALSE(NVXScanner().isPurchasedFromSonpixStore(Location::file("/none.m4a")));
  EXPECT_THAT(world.calls.all(), ElementsAre("itemKeys /none.m4a"));
}

TEST(StringForOSType, DropsLeadingZeroBytesAndEndsAtTheFirstOther) {
  const struct {
    std::uint32_t code;
    std::string text;
  } rows[] = {
      {0x70757264, "purd"},
      {0x00616263, "abc"},
      {0x00006162, "ab"},
      {0x00000061, "a"},
      {0, ""},
      {0x61006263, "a"},
      {0x61620063, "ab"},
      {0x61626300, "abc"},
      {0x00610062, "a"},
      {0x00006100, "a"},
      {0x61000000, "a"},
      {0x20202020, "    "},
      {0x7E202121, "~ !!"},
      {0x01000000, "\x01"},
  };
  for (const auto& row : rows)
    EXPECT_EQ(NVXScanner::stringForOSType(row.code), row.text) << std::hex << row.code;
}

TEST(StringForOSType, GivesOneCharacterForEachByteOfTheUpperHalf) {
  for (std::uint32_t byte = 0x80; byte <= 0xFF; ++byte) {
    const std::string text = NVXScanner::stringForOSType(byte << 24U | 0x6E616D);
    const auto isContinuation = [](char c) { return (static_cast<unsigned char>(c) & 0xC0U) == 0x80U; };
    EXPECT_EQ(std::count_if(text.begin(), text.end(), [&](char c) { return !isContinuation(c); }), 4) << text;
    EXPECT_TRUE(text.ends_with("nam")) << text;
  }
}

}  // namespace
}  // namespace norvex
