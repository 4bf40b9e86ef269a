#include <gmock/gmock.h>

#include <algorithm>

#include "tests/scanner/MediaWorld.h"

namespace norvex {
namespace {

using Library = MediaWorld::PhotoLibrary;
using ::testing::IsEmpty;

std::string scannedMovie(const MediaMatch& match, Library library = Library::none) {
  return MediaWorld(movies, match, library).scanned({"movies", "Movies"});
}

// How often the size of the one item was asked for.
std::ptrdiff_t measurements(const ScanWorld& world, const std::string& path) {
  return std::ranges::count(world.calls.all(), "value TotalFileSize " + path);
}

TEST(MovieHandler, CountsByPlace) {
  const struct {
    const char* path;
    const char* figures;
  } rows[] = {
      {"/Users/user/Library/Mobile Documents/x/a.mov", "moviesInMobileDocumentsDirectory=7"},
      {"/Users/user/Library/a.mov", "moviesInLibraryDirectory=7"},
      {"/Users/user/a.mov", "moviesInHomeDirectory=7"},
      {"/Users/userx/a.mov", "moviesInHomeDirectory=7"},
      {"/Users/Shared/a.mov", "moviesInUsersSharedDirectory=7"},
      {"/Volumes/Ext/a.mov", "moviesInOtherLocations=7"},
      {"/Applications/G.app/a.mov", "moviesInApplicationBundles=7"},
      {"/Users/user/Library/G.app/a.mov", "moviesInApplicationBundles=7"},
  };
  for (const auto& row : rows) EXPECT_EQ(scannedMovie({row.path}), row.figures) << row.path;
}

TEST(MovieHandler, CountsTheMediaFolderOnTopOfThePlace) {
  const std::string onTop = "moviesInStandardLocationSize=7 startupDiskMoviesInStandardLocationSize=7 ";
  EXPECT_EQ(scannedMovie({"/Users/user/Music/Sonpix/Media/clip.avi"}), onTop + "moviesInHomeDirectory=7");
  EXPECT_EQ(scannedMovie({"/Users/user/Music/Sonpix.mov"}), onTop + "moviesInHomeDirectory=7");
  EXPECT_EQ(scannedMovie({"/Users/user/Music/Sonpix/G.app/a.mov"}), onTop + "moviesInApplicationBundles=7");
}

TEST(MovieHandler, CountsAMovieOfAPhotoLibraryInNoPlace) {
  const std::string inLibrary =
      "moviesInPicaraLumviaLibrarySize=7 startupDiskMoviesInPicaraLumviaLibrarySize=7";
  for (const char* path :
       {"/Users/user/Pictures/Picara Library/a.mov", "/Users/user/Pictures/Lumvia Library/V.app/a.mov",
        "/Users/user/Desktop/Picara Library/a.mov", "/Users/user/Documents/Picara Library.mov"}) {
    EXPECT_EQ(scannedMovie({path}, Library::exists), inLibrary) << path;
  }
  EXPECT_EQ(scannedMovie({"/Users/user/Desktop/Picara Library.mov"}, Library::none),
            "moviesInHomeDirectory=7");
  EXPECT_EQ(scannedMovie({"/Users/user/Desktop/Picara Library/a.mov", 7, true}, Library::exists),
            inLibrary + " sonpixStoreMoviesSize=7 startupDiskSonpixStoreMoviesSize=7");
}

TEST(MovieHandler, CountsPurchasesOnTopOfThePlace) {
  const std::string place = "moviesInOtherLocations=7";
  const std::string bought = place + " sonpixStoreMoviesSize=7 startupDiskSonpixStoreMoviesSize=7";
  const struct {
    const char* claim;
    const char* path;
    bool hasPurchaseDate;
    bool holdsPurchaseItem;
    bool isBought;
    bool isFileOpened;
  } rows[] = {
      {"the index knows the date", "/x/a.m4v", true, false, true, false},
      {"any form", "/x/a", true, true, true, false},
      {"only the file knows", "/x/a.m4v", false, true, true, true},
      {"nobody knows", "/x/a.mov", false, false, false, true},
      {"one foreign form is never asked about", "/x/a.avi", true, true, false, false},
      {"nor the other", "/x/a.mkv", true, true, false, false},
      {"but in another case", "/x/a.AVI", false, true, true, true},
      {"and when the name goes on", "/x/a.mkv.mp4", false, true, true, true},
      {"and without the point", "/x/amkv", true, false, true, false},
      {"or the other form's letters", "/x/aavi", true, false, true, false},
  };
  for (const auto& row : rows) {
    MediaWorld world(movies, {row.path, 7, row.hasPurchaseDate, row.holdsPurchaseItem}, Library::none);
    EXPECT_EQ(world.scanned({"movies", "Movies"}), row.isBought ? bought : place) << row.claim;
    EXPECT_EQ(world.calls.of({"itemKeys"}).size(), row.isFileOpened ? 1U : 0U) << row.claim;
    EXPECT_THAT(world.systemLog.lines, IsEmpty()) << row.claim;
  }
}

TEST(MovieHandler, DoesNotEvenAskTheIndexAboutForeignForms) {
  for (const char* path : {"/Users/user/Music/Sonpix/Media/clip.avi", "/x/a.mkv"}) {
    MediaWorld world(movies, {path, 7, true}, Library::none);
    NVXScanner().scan();
    EXPECT_EQ(std::ranges::count(world.calls.all(), std::string("attribute kMDItemPurchaseDate ") + path), 0);
  }
}

TEST(MovieHandler, MeasuresAnItemOnceHoweverOftenItCounts) {
  const std::string path = "/Users/user/Music/Sonpix/a.m4v";
  MediaWorld world(movies, {path, 7, true}, Library::none);
  EXPECT_EQ(
      world.scanned({"movies", "Movies"}),
      "moviesInStandardLocationSize=7 startupDiskMoviesInStandardLocationSize=7 moviesInHomeDirectory=7 "
      "sonpixStoreMoviesSize=7 startupDiskSonpixStoreMoviesSize=7");
  EXPECT_EQ(measurements(world, path), 1);
}

TEST(MovieHandler, MeasuresAnItemOfSizeZeroAgainEachTime) {
  const std::string path = "/Users/user/Music/Sonpix/a.m4v";
  MediaWorld world(movies, {path, 0, true}, Library::none);
  EXPECT_EQ(world.scanned({"movies", "Movies"}), "");
  EXPECT_EQ(measurements(world, path), 3);
}

TEST(MovieHandler, KeepsTheFirstSizeThatIsNotZero) {
  const std::string path = "/Users/user/Music/Sonpix/a.m4v";
  MediaWorld world(movies, {path, 9, true}, Library::none);
  world.resourceValues.nextSizes[path] = {0, 5};
  EXPECT_EQ(
      world.scanned({"movies", "Movies"}),
      "moviesInStandardLocationSize=5 startupDiskMoviesInStandardLocationSize=5 moviesInHomeDirectory=5");
  EXPECT_EQ(measurements(world, path), 2);
}

TEST(MovieHandler, MeasuresOnlyAfterTheStoreTestWhenItIsNotBought) {
  MediaWorld world(movies, {"/x/a.mov"}, Library::none);
  NVXScanner().scan();
  const std::vector<std::string> calls = world.calls.all();
  const auto asked = std::ranges::find(calls, "itemKeys /x/a.mov");
  ASSERT_NE(asked, calls.end());
  EXPECT_LT(asked, std::ranges::find(calls, "value IsDirectory /x/a.mov"));
}

}  // namespace
}  // namespace norvex
