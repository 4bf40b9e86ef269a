#include "platform/linux/MediaItemList.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdint>
#include <ostream>
#include <string>
#include <vector>

#include "media/Boxes.h"

namespace norvex {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using testing::SizeIs;

constexpr std::uint64_t kGiB = std::uint64_t{1} << 30U;
const std::string kCopyrightSign = "\xA9";

std::vector<MediaItemKey> keysOf(const Bytes& file) {
  BytesSource source(file);
  return mediaItemKeys(source);
}

struct Case {
  std::string name;
  Bytes file;
  std::vector<std::string> keys;
};

// The name by which the test runner lists the case.
void PrintTo(const Case& testCase, std::ostream* out) {
  *out << testCase.name;
}

class Layout : public testing::TestWithParam<Case> {};

TEST_P(Layout, YieldsTheKeysInTheirOrder) {
  EXPECT_EQ(shown(keysOf(GetParam().file)), GetParam().keys);
}

Bytes userData(const Bytes& metadata) {
  return box("udta", {metadata});
}

Bytes list() {
  return box("ilst", {item("one "), item("purd")});
}

const std::vector<std::string> kListed = {"one ", "purd"};
const std::vector<std::string> kNone;

std::vector<Case> layouts() {
  const Bytes items = movie({item("one "), item("purd")});
  const Bytes samples = Bytes::zeros(5000);
  const Bytes versioned = box("meta", {version0, handler(), list()});
  return {
      {"MovieFirst", joined({fileType(), items, box("mdat", {samples})}), kListed},
      {"MovieLast", joined({fileType(), box("free", {}), box("mdat", {samples}), items}), kListed},
      {"MovieBetween", joined({fileType(), box("mdat", {samples}), items, box("mdat", {samples})}), kListed},
      {"NoFileType", items, kListed},
      {"WideMediaData", joined({fileType(), wideBox("mdat", {Bytes::zeros(9 * kGiB)}), items}), kListed},
      {"OpenMediaData", joined({fileType(), items, openBox("mdat", {samples})}), kListed},
      {"OpenMediaDataFirst", joined({fileType(), openBox("mdat", {samples}), items}), kNone},
      {"OpenMovie", joined({fileType(), openBox("moov", {movieHeader(), userData(versioned)})}), kListed},
      {"OpenToTheLast",
       openBox("moov", {openBox("udta", {openBox("meta", {version0, openBox("ilst", {item("purd")})})})}),
       {"purd"}},
      {"WideToTheLast",
       wideBox("moov",
               {wideBox("udta", {wideBox("meta", {version0, wideBox("ilst", {wideBox("purd", {})})})})}),
       {"purd"}},
      {"WithoutVersion", box("moov", {userData(box("meta", {handler(), list()}))}), kListed},
      {"WithoutVersionAndHandler", box("moov", {userData(box("meta", {list()}))}), kListed},
      {"WithoutVersionButWide",
       box("moov", {userData(box("meta", {wideBox("ilst", {item("purd")})}))}),
       {"purd"}},
      {"WithVersionButNoHandler", box("moov", {userData(box("meta", {version0, list()}))}), kListed},
      {"WithVersionAndFlags",
       box("moov", {userData(box("meta", {bigEndianText(0x01000022, 4), handler(), list()}))}), kListed},
      {"FlagsThatLookLikeASize",
       box("moov", {userData(box("meta", {bigEndianText(0x22, 4), handler(), list()}))}), kListed},
      {"WithVersionAndALargeFirstChild",
       box("moov", {userData(box("meta", {version0, box("ilst", {box("covr", {Bytes::zeros(20000000)})})}))}),
       {"covr"}},
      {"UserDataBeforeTheTracks", box("moov", {userData(versioned), track(50), track(90000)}), kListed},
      {"UserDataBehindTracks", box("moov", {movieHeader(), track(90000), track(70000), userData(versioned)}),
       kListed},
      {"UserDataThatEndsInZero", box("moov", {box("udta", {versioned, version0})}), kListed},
      {"SpaceAround",
       joined({box("free", {samples}), box("wide", {}),
               box("moov",
                   {box("free", {}), box("udta", {box("name", {"x"}), versioned, box("free", {samples})})})}),
       kListed},
      {"OnlyTheFirstList", box("moov", {userData(versioned), userData(versioned)}), kListed},
      {"AListInTheSecondPlaceOfEach",
       box("moov",
           {box("udta", {}), box("udta", {box("meta", {}), box("meta", {version0, handler()}), versioned})}),
       kListed},
      {"OnlyTheFirstMovie", joined({movie({item("one ")}), movie({item("two ")})}), {"one "}},
      {"NoItems", movie({}), kNone},
      {"AnItemWithoutValue", movie({box("purd", {})}), {"purd"}},
      {"CodesOfAnyBytes",
       movie({item(kCopyrightSign + "nam"), item(std::string("\0abc", 4))}),
       {kCopyrightSign + "nam", std::string("\0abc", 4)}},
      {"ALargePictureBetween",
       movie({item("one "), box("covr", {box("data", {Bytes::zeros(3000000)})}), item("purd")}),
       {"one ", "covr", "purd"}},
      {"Twice", movie({item("one "), item("one ")}), {"one ", "one "}},
      {"ListInAnotherPlace",
       joined({versioned, userData(versioned), list(),
               box("moov", {versioned, list(), box("trak", {userData(versioned)}), box("udta", {list()})})}),
       kNone},
  };
}

std::string nameOf(const testing::TestParamInfo<Case>& info) {
  return info.param.name;
}

INSTANTIATE_TEST_SUITE_P(MediaItemList, Layout, testing::ValuesIn(layouts()), nameOf);

TEST(MediaItemList, TakesTheCodeOfThePurchaseDateAsANumber) {
  EXPECT_THAT(keysOf(movie({item("purd")})), ElementsAre(MediaItemKey(std::uint32_t{0x70757264})));
}

// --- free-form items

Bytes freeFormOf(Parts children) {
  return movie({box("----", children), item("last")});
}

class FreeFormKey : public testing::TestWithParam<Case> {};

TEST_P(FreeFormKey, IsAText) {
  EXPECT_EQ(shown(keysOf(GetParam().file)), GetParam().keys);
}

std::vector<Case> freeForms() {
  const Bytes value = box("data", {Bytes::zeros(2000)});
  const std::string longName(1000, 'n');
  const std::string cutName = longName.substr(0, maxMediaKeyPart);
  return {
      {"DomainAndName", movie({freeForm("org.example", "MOOD")}), {"\"org.example:MOOD\""}},
      {"NameFirst",
       freeFormOf({box("name", {version0, "N"}), box("mean", {version0, "D"})}),
       {"\"D:N\"", "last"}},
      {"ValueFirst",
       freeFormOf({value, box("mean", {version0, "D"}), box("name", {version0, "N"})}),
       {"\"D:N\"", "last"}},
      {"OnlyADomain", freeFormOf({box("mean", {version0, "D"}), value}), {"\"D\"", "last"}},
      {"OnlyAName", freeFormOf({box("name", {version0, "N"}), value}), {"\"N\"", "last"}},
      {"Neither", freeFormOf({value}), {"\"\"", "last"}},
      {"Empty", freeFormOf({}), {"\"\"", "last"}},
      {"NamesWithoutText",
       freeFormOf({box("mean", {version0}), box("name", {"abc"}), box("name", {})}),
       {"\"\"", "last"}},
      {"LongNamesAreCut",
       freeFormOf({box("mean", {version0, longName}), box("name", {version0, longName})}),
       {'"' + cutName + ":" + cutName + '"', "last"}},
      {"AnyBytes", movie({freeForm(std::string("\0\xFF", 2), "\xC3")}), {std::string("\"\0\xFF:\xC3\"", 6)}},
      {"NamesAndCodesInOrder",
       movie({item("one "), freeForm("D", "N"), item("two "), freeForm("D", "M")}),
       {"one ", "\"D:N\"", "two ", "\"D:M\""}},
  };
}

INSTANTIATE_TEST_SUITE_P(MediaItemList, FreeFormKey, testing::ValuesIn(freeForms()), nameOf);

TEST(MediaItemList, KeepsATextThatReadsLikeTheCodeOfAPurchaseApartFromThatCode) {
  EXPECT_THAT(keysOf(movie({box("----", {box("name", {version0, "purd"})})})),
              ElementsAre(MediaItemKey(std::string("purd"))));
}

// --- damaged files

// What a header may wrongly claim, as a box with nothing but its header.
struct BadHeader {
  std::string name;
  Bytes header;
};

// Each stands before at most `behind` bytes more.
std::vector<BadHeader> badHeaders(std::uint32_t behind) {
  std::vector<BadHeader> all;
  for (const std::uint32_t size : {2U, 4U, 7U}) {
    all.push_back({"SizeOf" + std::to_string(size), boxClaiming(size, "free", {})});
  }
  for (const std::uint32_t size : {8 + behind + 1, 0x7FFFFFFFU, 0x80000000U, 0xFFFFFFF8U, 0xFFFFFFFFU}) {
    all.push_back({"SizeOf" + std::to_string(size), boxClaiming(size, "free", {})});
  }
  const std::uint64_t top = UINT64_MAX;
  const std::uint64_t half = std::uint64_t{1} << 63U;
  for (const std::uint64_t size : {std::uint64_t{0}, std::uint64_t{1}, std::uint64_t{8}, std::uint64_t{15},
                                   16 + std::uint64_t{behind} + 1, (std::uint64_t{1} << 32U) + 16, half - 1,
                                   half, top - 4096, top - 15, top - 7, top}) {
    all.push_back({"WideSizeOf" + std::to_string(size), wideBoxClaiming(size, "free", {})});
  }
  return all;
}

// One case a place and a header: the header stands between good boxes, so that going on behind it would show.
std::vector<Case> damagedFiles() {
  std::vector<Case> cases;
  const Bytes good = box("udta", {box("meta", {version0, list()})});
  const auto behind = static_cast<std::uint32_t>(good.size() + 8);
  for (const auto& [name, bad] : badHeaders(behind)) {
    cases.push_back({"AmongTheOutermost" + name, joined({fileType(), bad, box("moov", {good})}), kNone});
    cases.push_back({"InTheMovie" + name, box("moov", {bad, good}), kNone});
    cases.push_back(
        {"InTheUserData" + name, box("moov", {box("udta", {bad, box("meta", {version0, list()})})}), kNone});
    cases.push_back(
        {"InTheMetadata" + name, box("moov", {userData(box("meta", {version0, bad, list()}))}), kNone});
    cases.push_back({"BetweenItems" + name, movie({item("one "), bad, item("two ")}), {"one "}});
    cases.push_back({"InAFreeFormItem" + name,
                     movie({box("----", {box("mean", {version0, "D"}), bad, box("name", {version0, "N"})}),
                            item("two ")}),
                     {"\"D\"", "two "}});
    cases.push_back({"BeforeAnotherUserData" + name,
                     box("moov", {box("udta", {bad, box("meta", {version0, list()})}), good}), kListed});
  }
  return cases;
}

// In one test: a process for each of so many short cases would take most of the time.
TEST(MediaItemList, EndsTheWalkOfAParentAtABoxThatDoesNotFit) {
  const auto cases = damagedFiles();
  EXPECT_THAT(cases, SizeIs(testing::Gt(100U)));
  for (const auto& damaged : cases) EXPECT_EQ(shown(keysOf(damaged.file)), damaged.keys) << damaged.name;
}

class OtherFile : public testing::TestWithParam<Case> {};

TEST_P(OtherFile, HasNoKeys) {
  EXPECT_THAT(keysOf(GetParam().file), IsEmpty());
}

std::vector<Case> otherFiles() {
  const Bytes wideHeaderCut = boxClaiming(1, "moov", {"1234567"});
  return {
      {"Empty", {}, {}},
      {"OneByte", "m", {}},
      {"SevenBytes", Bytes::zeros(7), {}},
      {"OnlyAHeader", box("moov", {}), {}},
      {"HalfAWideHeader", wideHeaderCut, {}},
      {"Zeros", Bytes::zeros(100000), {}},
      {"ManyGigabytesOfZeros", Bytes::zeros(UINT64_MAX), {}},
      {"AllBitsSet", std::string(100000, '\xFF'), {}},
      {"Text", std::string("this is not a media file\n"), {}},
      {"OpenUserDataBeforeOthers",
       joined({box("moov", {openBox("udta", {box("meta", {version0, list()})})}), box("free", {})}),
       {}},
      {"EmptyMetadata", box("moov", {userData(box("meta", {}))}), {}},
      {"MetadataOfThreeBytes", box("moov", {userData(box("meta", {"abc"}))}), {}},
      {"CodeInAPayload", joined({fileType(), box("mdat", {item("purd")}), box("free", {list()})}), {}},
  };
}

INSTANTIATE_TEST_SUITE_P(MediaItemList, OtherFile, testing::ValuesIn(otherFiles()), nameOf);

TEST(MediaItemList, YieldsNoMoreThanTheWholeFileWhereverAFileIsCut) {
  const Bytes whole = joined({fileType(), movie({item("one "), freeForm("D", "N"), item("purd")})});
  for (std::uint64_t size = 0; size < whole.size(); ++size) {
    EXPECT_THAT(keysOf(whole.shortenedTo(size)), IsEmpty()) << size;
  }
  EXPECT_THAT(shown(keysOf(whole)), ElementsAre("one ", "\"D:N\"", "purd"));
}

TEST(MediaItemList, KeepsTheKeysBeforeAReadThatFails) {
  BytesSource source(movie({item("one "), box("covr", {Bytes::zeros(5000)}), item("two ")}));
  source.failFrom(3);
  EXPECT_THAT(shown(mediaItemKeys(source)), ElementsAre("one ", "covr"));
}

TEST(MediaItemList, HasNoKeysWhenNothingCanBeRead) {
  BytesSource source(movie({item("one ")}));
  source.failFrom(1);
  EXPECT_THAT(mediaItemKeys(source), IsEmpty());
}

}  // namespace
}  // namespace norvex
