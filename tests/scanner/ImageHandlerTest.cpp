#include <gmock/gmock.h>

#include "tests/scanner/MediaWorld.h"

namespace norvex {
namespace {

using Library = MediaWorld::PhotoLibrary;
using ::testing::ElementsAre;

std::string scannedImage(const std::string& path, Library library) {
  return MediaWorld(images, {path}, library).scanned({"images", "Images"});
}

TEST(ImageHandler, CountsByPlace) {
  const struct {
    const char* path;
    const char* figures;
  } rows[] = {
      {"/Users/user/Library/Mobile Documents/x/a.jpg", "imagesInMobileDocumentsDirectory=7"},
      {"/Users/user/Library/Mobile DocumentsX/a.jpg", "imagesInMobileDocumentsDirectory=7"},
      {"/Users/user/Library/a.jpg", "imagesInLibraryDirectory=7"},
      {"/Users/user/LibraryX/a.jpg", "imagesInLibraryDirectory=7"},
      {"/Users/user/library/a.jpg", "imagesInHomeDirectory=7"},
      {"/Users/user/Pictures/a.jpg", "imagesInHomeDirectory=7"},
      {"/Users/userx/a.jpg", "imagesInHomeDirectory=7"},
      {"/Users/User/a.jpg", "imagesInOtherLocations=7"},
      {"/Users/Shared/a.jpg", "imagesInUsersSharedDirectory=7"},
      {"/Users/SharedX/a.jpg", "imagesInUsersSharedDirectory=7"},
      {"/Users/a.jpg", "imagesInOtherLocations=7"},
      {"/Volumes/Ext/a.jpg", "imagesInOtherLocations=7"},
      {"/Volumes/Ext/Users/user/a.jpg", "imagesInOtherLocations=7"},
  };
  for (const auto& row : rows) EXPECT_EQ(scannedImage(row.path, Library::none), row.figures) << row.path;
}

TEST(ImageHandler, CountsAnImageOfAPhotoLibraryOnlyThere) {
  const char* inLibrary = "imagesInStandardLocation=7 startupDiskImagesInStandardLocation=7";
  // The flag is one for all libraries: it is set by the one that exists.
  for (const char* path :
       {"/Users/user/Pictures/Picara Library/Masters/a.jpg", "/Users/user/Pictures/Lumvia Library/a.jpg",
        "/Users/user/Desktop/Picara Library/a.jpg", "/Users/user/Documents/Picara Library/a.jpg",
        "/Users/user/Pictures/Picara Library copy.jpg",
        "/Users/user/Pictures/Picara Library/V.app/icon.png"}) {
    EXPECT_EQ(scannedImage(path, Library::exists), inLibrary) << path;
  }
  for (const char* path :
       {"/Users/user/Pictures/picara Library/a.jpg", "/Users/user/Desktop/Lumvia Library/a.jpg"}) {
    EXPECT_EQ(scannedImage(path, Library::exists), "imagesInHomeDirectory=7") << path;
  }
}

TEST(ImageHandler, TakesAPhotoLibraryForAnyFolderWhenNoneExists) {
  EXPECT_EQ(scannedImage("/Users/user/Pictures/Lumvia Library.jpg", Library::none),
            "imagesInHomeDirectory=7");
}

TEST(ImageHandler, CountsAnImageInABundleThereAndInItsPlace) {
  const struct {
    const char* path;
    const char* figures;
  } rows[] = {
      {"/Applications/Viewer.app/Contents/Resources/icon.png",
       "imagesInApplicationBundles=7 imagesInOtherLocations=7"},
      {"/Users/user/Library/X.app/a.png", "imagesInApplicationBundles=7 imagesInLibraryDirectory=7"},
      {"/Users/Shared/X.app/Y.app/a.png", "imagesInApplicationBundles=7 imagesInUsersSharedDirectory=7"},
      {"/Applications/.app/a.png", "imagesInApplicationBundles=7 imagesInOtherLocations=7"},
      {"/Applications/X.APP/a.png", "imagesInOtherLocations=7"},
      {"/Applications/X.application/a.png", "imagesInOtherLocations=7"},
      {"/Applications/X.app", "imagesInOtherLocations=7"},
  };
  for (const auto& row : rows) EXPECT_EQ(scannedImage(row.path, Library::none), row.figures) << row.path;
}

TEST(ImageHandler, MeasuresEachImageOnceAsAFile) {
  for (const Library library : {Library::none, Library::exists}) {
    for (const char* path : {"/Users/user/Pictures/Picara Library/a.jpg", "/A/V.app/a.jpg", "/x/a.jpg"}) {
      MediaWorld world(images, {path, 0}, library);
      NVXScanner().scan();
      const std::string call = std::string("value IsDirectory ") + path;
      EXPECT_EQ(std::ranges::count(world.calls.all(), call), 1) << path;
    }
  }
}

TEST(ImageHandler, LogsAMissingImageAsAFileAndAddsNothing) {
  ScanWorld world;
  world.metadataIndex.volumes["/"].matches[queryPredicates[images]] = {{"/gone/a.jpg"}};
  EXPECT_EQ(figures(NVXScanner().scan(), {"images", "Images"}), "");
  EXPECT_THAT(
      world.systemLog.lines,
      ElementsAre("3 Failed to get QXURLIsDirectoryKey for file:///gone/a.jpg, error: No such file or "
                  "directory"));
}

TEST(ImageHandler, NeverAsksWhetherAnImageWasBought) {
  MediaWorld world(images, {"/x/a.m4a"}, Library::none);
  NVXScanner().scan();
  EXPECT_THAT(world.calls.of({"itemKeys"}), ElementsAre());
  EXPECT_THAT(world.calls.all(),
              ::testing::Not(::testing::Contains("attribute kMDItemPurchaseDate /x/a.m4a")));
}

}  // namespace
}  // namespace norvex
