#include <gmock/gmock.h>

#include <algorithm>

#include "tests/scanner/MediaWorld.h"

namespace norvex {
namespace {

using Library = MediaWorld::PhotoLibrary;
using ::testing::ElementsAre;
using ::testing::IsEmpty;

std::string scannedMusic(const MediaMatch& match) {
  return MediaWorld(music, match, Library::exists).scanned({"music", "Music"});
}

TEST(MusicHandler, CountsByPlace) {
  const struct {
    const char* path;
    const char* figures;
  } rows[] = {
      {"/Users/user/Library/Mobile Documents/x/a.mp3", "musicInMobileDocumentsDirectory=7"},
      {"/Users/user/Library/a.mp3", "musicInLibraryDirectory=7"},
      {"/Users/user/a.mp3", "musicInHomeDirectory=7"},
      {"/Users/userx/a.mp3", "musicInHomeDirectory=7"},
      {"/Users/Shared/Music/a.mp3", "musicInUsersSharedDirectory=7"},
      {"/Volumes/Ext/song.mp3", "musicInOtherLocations=7"},
      {"/Users/user/Pictures/Picara Library/a.mp3", "musicInHomeDirectory=7"},
  };
  for (const auto& row : rows) EXPECT_EQ(scannedMusic({row.path}), row.figures) << row.path;
}

TEST(MusicHandler, CountsAnItemOfABundleThereAndInNoPlace) {
  EXPECT_EQ(scannedMusic({"/Applications/G.app/a.mp3"}), "musicInApplicationBundles=7");
  EXPECT_EQ(scannedMusic({"/Users/user/Library/G.app/a.mp3"}), "musicInApplicationBundles=7");
}

TEST(MusicHandler, CountsTheMediaFolderOnTopOfThePlace) {
  const char* onTop = "musicInStandardLocationSize=7 startupDiskMusicInStandardLocationSize=7 ";
  EXPECT_EQ(scannedMusic({"/Users/user/Music/Sonpix/a.mp3"}), std::string(onTop) + "musicInHomeDirectory=7");
  EXPECT_EQ(scannedMusic({"/Users/user/Music/Sonpix 2/a.mp3"}),
            std::string(onTop) + "musicInHomeDirectory=7");
  EXPECT_EQ(scannedMusic({"/Users/user/Music/Sonpix/G.app/a.mp3"}),
            std::string(onTop) + "musicInApplicationBundles=7");
  EXPECT_EQ(scannedMusic({"/Users/user/Music/sonpix/a.mp3"}), "musicInHomeDirectory=7");
}

TEST(MusicHandler, CountsPurchasesOnTopOfThePlace) {
  const std::string place = "musicInMobileDocumentsDirectory=7";
  const std::string bought = place + " sonpixStoreMusicSize=7 startupDiskSonpixStoreMusicSize=7";
  const struct {
    const char* claim;
    const char* name;
    bool hasPurchaseDate;
    bool holdsPurchaseItem;
    bool isBought;
    bool isFileOpened;
  } rows[] = {
      {"the index knows the date", "song.m4a", true, false, true, false},
      {"the protected form too", "song.m4p", true, true, true, false},
      {"only the file knows", "song.m4a", false, true, true, true},
      {"nobody knows", "song.m4p", false, false, false, true},
      {"another form is not asked about", "song.mp3", true, true, false, false},
      {"nor another case", "song.M4A", true, true, false, false},
      {"nor a form in the middle of the name", "song.m4a.bak", true, true, false, false},
      {"an empty name before the form", ".m4a", true, false, true, false},
      {"no point before the form", "songm4a", true, true, false, false},
  };
  for (const auto& row : rows) {
    const std::string path = std::string("/Users/user/Library/Mobile Documents/x/") + row.name;
    MediaWorld world(music, {path, 7, row.hasPurchaseDate, row.holdsPurchaseItem}, Library::none);
    EXPECT_EQ(world.scanned({"music", "Music"}), row.isBought ? bought : place) << row.claim;
    EXPECT_EQ(world.calls.of({"itemKeys"}).size(), row.isFileOpened ? 1U : 0U) << row.claim;
    EXPECT_EQ(world.systemLog.lines, std::vector<std::string>()) << row.claim;
  }
}

TEST(MusicHandler, CountsOneItemInAllThreeWaysAtOnce) {
  EXPECT_EQ(scannedMusic({"/Users/user/Music/Sonpix/a.m4a", 7, true}),
            "musicInStandardLocationSize=7 startupDiskMusicInStandardLocationSize=7 musicInHomeDirectory=7 "
            "sonpixStoreMusicSize=7 startupDiskSonpixStoreMusicSize=7");
}

TEST(MusicHandler, MeasuresEveryItemOnceBeforeAnyTest) {
  for (const std::uint64_t size : {0U, 7U}) {
    MediaWorld world(music, {"/Users/user/Music/Sonpix/a.m4a", size}, Library::none);
    NVXScanner().scan();
    const std::vector<std::string> calls = world.calls.all();
    const auto measured = std::ranges::find(calls, "value IsDirectory /Users/user/Music/Sonpix/a.m4a");
    const auto asked =
        std::ranges::find(calls, "attribute kMDItemPurchaseDate /Users/user/Music/Sonpix/a.m4a");
    ASSERT_NE(asked, calls.end());
    EXPECT_LT(measured, asked);
    EXPECT_EQ(std::ranges::count(calls, *measured), 1);
  }
}

TEST(MusicHandler, MeasuresAPackageAsAWhole) {
  ScanWorld world;
  world.files.put("/x", package("song.band", {file("a", 3), file("b", 4)}));
  world.metadataIndex.volumes["/"].matches[queryPredicates[music]] = {{"/x/song.band"}};
  EXPECT_EQ(figures(NVXScanner().scan(), {"music", "Music"}), "musicInOtherLocations=7");
  EXPECT_THAT(world.systemLog.lines, IsEmpty());
}

}  // namespace
}  // namespace norvex
