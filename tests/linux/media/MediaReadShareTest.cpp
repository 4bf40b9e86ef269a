// How much of a file is read, and how much of it is kept, whatever its headers claim.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdint>
#include <ostream>
#include <string>
#include <vector>

#include "media/Boxes.h"
#include "platform/linux/BoxReader.h"
#include "platform/linux/MediaItemList.h"

namespace norvex {
namespace {

using testing::ElementsAre;

constexpr std::uint64_t kGiB = std::uint64_t{1} << 30U;

struct Case {
  std::string name;
  Bytes file;
};

// The name by which the test runner lists the case.
void PrintTo(const Case& testCase, std::ostream* out) {
  *out << testCase.name;
}

std::string nameOf(const testing::TestParamInfo<Case>& info) {
  return info.param.name;
}

std::size_t bytesKept(const std::vector<MediaItemKey>& keys) {
  std::size_t kept = keys.capacity() * sizeof(MediaItemKey);
  for (const auto& key : keys) {
    if (const auto* text = std::get_if<std::string>(&key)) kept += text->capacity();
  }
  return kept;
}

// --- files as players and recorders write them

// A piece of music or a film as it is usually tagged: twenty short items around a picture.
Bytes ordinaryMovie(std::size_t tracks) {
  Bytes items = joined({repeated(14, item("text")), freeForm("org.example.tags", "FIELD")});
  items.append(box("covr", {box("data", {Bytes::zeros(60000)})}));
  items.append(joined({repeated(5, item("more")), item("purd")}));
  const Bytes metadata =
      box("meta", {version0, handler(), box("ilst", {items}), box("free", {Bytes::zeros(512)})});
  return box("moov", {movieHeader(), repeated(tracks, track(45000)), box("udta", {metadata})});
}

class OrdinaryFile : public testing::TestWithParam<Case> {};

TEST_P(OrdinaryFile, TakesAHandfulOfShortReads) {
  BytesSource source(GetParam().file);
  const auto keys = mediaItemKeys(source);

  EXPECT_EQ(keys.size(), 22U);
  EXPECT_EQ(shown(keys).back(), "purd");
  EXPECT_LE(source.reads(), 10U);
  EXPECT_LE(source.bytesRead(), 10 * BoxReader::windowSize);
}

INSTANTIATE_TEST_SUITE_P(
    MediaReadShare, OrdinaryFile,
    testing::Values(
        Case{"MovieFirst", joined({fileType(), ordinaryMovie(1), box("mdat", {Bytes::zeros(kGiB)})})},
        Case{"MovieLast", joined({fileType(), box("mdat", {Bytes::zeros(kGiB)}), ordinaryMovie(2)})},
        Case{"MovieBehindManyGigabytes",
             joined({fileType(), wideBox("mdat", {Bytes::zeros(900 * kGiB)}), ordinaryMovie(2)})},
        Case{"MovieBeforeManyGigabytes",
             joined({fileType(), ordinaryMovie(2), openBox("mdat", {Bytes::zeros(900 * kGiB)})})},
        Case{"MovieAtTheLastOffset",
             [] {
               const Bytes last = ordinaryMovie(1);
               const std::uint64_t before = UINT64_MAX - last.size() - 16;
               return joined({wideBox("mdat", {Bytes::zeros(before)}), last});
             }()}),
    nameOf);

TEST(MediaReadShare, FindsTheListBehindDozensOfTracks) {
  BytesSource source(joined({fileType(), ordinaryMovie(60)}));
  EXPECT_EQ(shown(mediaItemKeys(source)).back(), "purd");
}

TEST(MediaReadShare, OfAFileOfAnotherKindIsOneWindow) {
  BytesSource source(Bytes(std::string(1000000, 'x')));
  EXPECT_TRUE(mediaItemKeys(source).empty());
  EXPECT_EQ(source.reads(), 1U);
  EXPECT_EQ(source.bytesRead(), BoxReader::windowSize);
}

TEST(MediaReadShare, StopsBehindTheMovieOfALongRecording) {
  const Bytes fragment = joined({box("moof", {Bytes::zeros(2000)}), box("mdat", {Bytes::zeros(9000)})});
  BytesSource source(joined({fileType(), movie({item("one ")}), repeated(5000, fragment)}));
  EXPECT_THAT(shown(mediaItemKeys(source)), ElementsAre("one "));
  EXPECT_LE(source.reads(), 2U);
}

// --- files made to keep a reader busy

class HostileFile : public testing::TestWithParam<Case> {};

TEST_P(HostileFile, CostsNoMoreThanTheShareOfOneFile) {
  BytesSource source(GetParam().file);
  const auto keys = mediaItemKeys(source);

  EXPECT_LE(source.bytesRead(), 48U * 1024);
  EXPECT_LE(source.reads(), BoxReader::maxBoxes);
  EXPECT_LE(keys.size(), maxMediaItems);
  EXPECT_LE(bytesKept(keys), 48U * 1024);
}

Bytes nested(int depth, std::string_view type) {
  // Written from the outside in: each header claims all that follows it.
  std::string text;
  for (int level = 0; level < depth; ++level) {
    text += bigEndianText(static_cast<std::uint64_t>(depth - level) * 8, 4) + std::string(type);
  }
  return text;
}

std::vector<Case> hostileFiles() {
  const Bytes emptyList = box("udta", {box("meta", {version0, box("ilst", {})})});
  const Bytes fullList = box("udta", {box("meta", {version0, box("ilst", {repeated(300, item("many"))})})});
  const Bytes far = box("free", {Bytes::zeros(100000)});
  const std::string longName(60, 'n');
  return {
      {"NestedMovies", nested(100000, "moov")},
      {"NestedUserData", box("moov", {nested(100000, "udta")})},
      {"NestedMetadata", box("moov", {box("udta", {nested(100000, "meta")})})},
      {"NestedFreeFormItems", movie({nested(100000, "----")})},
      {"FloodOfOutermostBoxes", repeated(200000, box("free", {}))},
      {"FloodOfDistantOutermostBoxes", repeated(20000, far)},
      {"FloodOfMovies", repeated(20000, box("moov", {}))},
      {"FloodOfTracks", box("moov", {repeated(20000, track(9000)), fullList})},
      {"FloodOfEmptyLists", box("moov", {repeated(20000, emptyList)})},
      {"FloodOfFullLists", box("moov", {repeated(100, fullList)})},
      {"FloodOfItems", movie({repeated(200000, box("purd", {}))})},
      {"FloodOfLargeItems", movie({repeated(20000, box("covr", {Bytes::zeros(9000)}))})},
      {"FloodOfFreeFormItems", movie({repeated(20000, freeForm(longName, longName))})},
      {"FloodWithinAFreeFormItem", movie({box("----", {repeated(200000, box("data", {}))})})},
      {"FloodOfNamesWithinAFreeFormItem",
       movie({box("----", {repeated(20000, box("name", {version0, longName}))})})},
      {"NameOfGigabytes",
       joined(
           {box("moov",
                {box("udta",
                     {box("meta",
                          {version0, box("ilst", {box("----", {box("mean", {Bytes::zeros(2 * kGiB)}),
                                                               box("name", {Bytes::zeros(kGiB)})})})})})})})},
      {"ListOfGigabytesOfZeros",
       box("moov", {box("udta", {box("meta", {version0, box("ilst", {Bytes::zeros(3 * kGiB)})})})})},
      {"CountOfAllItems", movie({box("disk", {std::string(64, '\xFF')}),
                                 box("keys", {version0, std::string(4, '\xFF')}), item("purd")})},
      {"CountOfAllSamples",
       box("moov", {box("trak", {box("stsz", {version0, std::string(8, '\xFF')})}), fullList})},
  };
}

INSTANTIATE_TEST_SUITE_P(MediaReadShare, HostileFile, testing::ValuesIn(hostileFiles()), nameOf);

TEST(MediaReadShare, EndsBehindTheLastBoxOfItsShare) {
  const Bytes items = movie({item("purd")});
  BytesSource near(joined({repeated(BoxReader::maxBoxes / 2, box("free", {})), items}));
  BytesSource far(joined({repeated(BoxReader::maxBoxes, box("free", {})), items}));
  EXPECT_EQ(mediaItemKeys(near).size(), 1U);
  EXPECT_EQ(mediaItemKeys(far).size(), 0U);
}

TEST(MediaReadShare, KeepsTheFirstItemsOfAnEndlessList) {
  BytesSource source(movie({item("purd"), repeated(5000, item("many"))}));
  const auto keys = mediaItemKeys(source);
  ASSERT_EQ(keys.size(), maxMediaItems);
  EXPECT_EQ(shown(keys).front(), "purd");
}

}  // namespace
}  // namespace norvex
