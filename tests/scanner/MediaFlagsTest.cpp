#include <gmock/gmock.h>

#include "scanner/NVXScanner.h"
#include "tests/scanner/ScanWorld.h"

namespace norvex {
namespace {

using ::testing::IsEmpty;
using ::testing::SizeIs;

// The figures of one item that one query finds on the volume.
std::string scanned(const ScanWorld&, std::initializer_list<std::string_view> parts) {
  return figures(NVXScanner().scan(), parts);
}

TEST(PhotoLibraryFlag, NeedsALibraryThatExistsAndWhosePathBeginsWithTheVolumes) {
  const struct {
    const char* claim;
    const char* volume;
    TreeItem photoLibrary;
    bool isSet;
  } rows[] = {
      {"the startup volume holds every library", "/", folder("Picara Library"), true},
      {"a volume above the library", "/Users", folder("Picara Library"), true},
      {"a prefix need not end at a separator", "/Users/us", folder("Picara Library"), true},
      {"the library itself as the volume", "/Users/user/Pictures/Picara Library", folder("Picara Library"),
       true},
      {"a volume path with a separator at its end", "/Users/", folder("Picara Library"), true},
      {"another volume", "/Volumes/Ext", folder("Picara Library"), false},
      {"a file counts as a library", "/", file("Picara Library", 0), true},
      {"so does a link to something", "/", link("Picara Library", "/Users", 6), true},
      {"but not a link to nothing", "/", link("Picara Library", "/none", 5), false},
      {"no library of a known name", "/", folder("Other Library"), false},
  };
  for (const auto& row : rows) {
    ScanWorld world({row.volume});
    world.files.put("/Users/user/Pictures", row.photoLibrary);
    world.holds(row.volume, images, "/Users/user/Desktop/Picara Library.jpg", 7);
    world.holds(row.volume, movies, "/Users/user/Desktop/Picara Library.mov", 5);
    EXPECT_EQ(scanned(world, {"imagesIn", "moviesIn"}),
              row.isSet ? "imagesInStandardLocation=7 moviesInPicaraLumviaLibrarySize=5"
                        : "imagesInHomeDirectory=7 moviesInHomeDirectory=5")
        << row.claim;
  }
}

TEST(PhotoLibraryFlag, IsSetByAnyOfTheFourLibraries) {
  for (const char* parent : {"Pictures/Picara Library", "Pictures/Lumvia Library", "Desktop/Picara Library",
                             "Documents/Picara Library"}) {
    ScanWorld world;
    world.files.put(std::string("/Users/user/") + parent, file("x", 0));
    world.holds("/", images, "/Users/user/Pictures/Lumvia Library.jpg", 7);
    EXPECT_EQ(scanned(world, {"imagesIn"}), "imagesInStandardLocation=7") << parent;
  }
}

TEST(PhotoLibraryFlag, StopsAskingAtTheFirstLibraryThatHolds) {
  ScanWorld world;
  world.files.put("/Users/user/Pictures", folder("Picara Library"));
  world.files.put("/Users/user/Pictures", folder("Lumvia Library"));
  world.files.put("/Users/user/Desktop", folder("Picara Library"));
  world.files.put("/Users/user/Documents", folder("Picara Library"));
  scanned(world, {});
  EXPECT_THAT(world.calls.of({"exists"}), SizeIs(1));
}

TEST(PhotoLibraryFlag, IsPreparedAnewForEachVolume) {
  ScanWorld world({"/Volumes/Ext", "/"});
  world.files.put("/Users/user/Pictures", folder("Picara Library"));
  world.holds("/Volumes/Ext", images, "/Users/user/Pictures/Picara Library/a", 1);
  world.holds("/", images, "/Users/user/Pictures/Picara Library/b", 2);
  EXPECT_EQ(scanned(world, {"imagesIn"}), "imagesInStandardLocation=2 imagesInHomeDirectory=1");
}

TEST(MediaFolderFlag, ComparesPathsAloneAndNeedsNoFolder) {
  const struct {
    const char* volume;
    bool isSet;
  } rows[] = {
      {"/", true},         {"/Users", true},
      {"/Users/u", true},  {"/Users/user/Music/Sonpix", true},
      {"/Users/x", false}, {"/Users/user/Music/Sonpix/Media", false},
      {"/Volumes", false},
  };
  for (const auto& row : rows) {
    ScanWorld world({row.volume});
    world.metadataIndex.volumes[row.volume].matches[queryPredicates[music]] = {{"/Users/user/Music/Sonpix"}};
    world.metadataIndex.volumes[row.volume].matches[queryPredicates[movies]] = {{"/Users/user/Music/Sonpix"}};
    world.putFile("/Users/user/Music/Sonpix", 7);
    EXPECT_EQ(scanned(world, {"musicIn", "moviesIn"}),
              row.isSet
                  ? "musicInStandardLocationSize=7 moviesInStandardLocationSize=7 musicInHomeDirectory=7 "
                    "moviesInHomeDirectory=7"
                  : "musicInHomeDirectory=7 moviesInHomeDirectory=7")
        << row.volume;
    for (const std::string& call : world.calls.of({"exists"})) {
      EXPECT_EQ(call.find("Sonpix"), std::string::npos) << call;
    }
  }
}

TEST(MediaPlaces, FollowTheHomeFolderOfTheUser) {
  ScanWorld world;
  world.userFolders.homeFolder = "/home/anna";
  world.files.put("/home/anna/Pictures", folder("Lumvia Library"));
  world.holds("/", images, "/home/anna/Pictures/Lumvia Library/a", 1);
  world.holds("/", images, "/home/anna/Library/Mobile Documents/a", 2);
  world.holds("/", images, "/home/anna/Library/a", 4);
  world.holds("/", images, "/home/anna/a", 8);
  world.holds("/", images, "/Users/user/a", 16);
  world.holds("/", music, "/home/anna/Music/Sonpix/a", 32);
  EXPECT_EQ(scanned(world, {"imagesIn", "musicIn"}),
            "imagesInStandardLocation=1 musicInStandardLocationSize=32 imagesInMobileDocumentsDirectory=2 "
            "imagesInLibraryDirectory=4 imagesInHomeDirectory=8 imagesInOtherLocations=16 "
            "musicInHomeDirectory=32");
}

// --- what all handlers share

TEST(EveryHandler, IgnoresAMatchWithoutAPath) {
  for (const char* predicate : queryPredicates) {
    ScanWorld world;
    world.metadataIndex.volumes["/"].matches[predicate] = {{std::nullopt, true}};
    EXPECT_EQ(
        scanned(world, {"musicIn", "moviesIn", "imagesIn", "Store", "Apps", "chronel", "virtual", "dove"}),
        "");
    EXPECT_THAT(world.systemLog.lines, IsEmpty()) << predicate;
    EXPECT_THAT(world.calls.of({"itemKeys"}), IsEmpty()) << predicate;
  }
}

TEST(EveryHandler, AddsZeroWithALineForAMatchThatIsGone) {
  for (const char* predicate : queryPredicates) {
    ScanWorld world;
    world.metadataIndex.volumes["/"].matches[predicate] = {{"/gone.avi"}};
    EXPECT_EQ(
        scanned(world, {"musicIn", "moviesIn", "imagesIn", "Store", "Apps", "chronel", "virtual", "dove"}),
        "");
    EXPECT_THAT(world.systemLog.lines,
                ::testing::ElementsAre(
                    "3 Failed to get QXURLIsDirectoryKey for file:///gone.avi, error: No such file "
                    "or directory"))
        << predicate;
  }
}

TEST(PlainSums, GoToTheFigureOfTheirQuery) {
  const struct {
    Query query;
    const char* onStartupDisk;
    const char* elsewhere;
  } rows[] = {
      {exclusions, "chronelStickyExclusionSize=12 startupDiskChronelStickyExclusionSize=12",
       "chronelStickyExclusionSize=12"},
      {receipts, "dovecartContentSize=12 startupDiskDovecartContentSize=12", "dovecartContentSize=12"},
      {phoneApps, "kytAppsSize=12 startupDiskKytAppsSize=12", "kytAppsSize=12"},
      {virtualMachines, "virtualMachinesSize=12 startupDiskVirtualMachinesSize=12", "virtualMachinesSize=12"},
  };
  for (const auto& row : rows) {
    for (const char* volume : {"/", "/Volumes/Ext"}) {
      ScanWorld world({volume});
      world.files.put("/m", package("p.app", {file("x", 3), file("y", 4)}));
      world.metadataIndex.volumes[volume].matches[queryPredicates[row.query]] = {{"/m/p.app"}};
      world.holds(volume, row.query, "/m/f", 5);
      EXPECT_EQ(
          scanned(world, {"musicIn", "moviesIn", "imagesIn", "Store", "Apps", "hronel", "irtual", "ovecart"}),
          std::string(volume) == "/" ? row.onStartupDisk : row.elsewhere);
    }
  }
}

TEST(PlainSums, Wrap) {
  ScanWorld world;
  world.holds("/", phoneApps, "/a", 18446744073709551615U);
  world.holds("/", phoneApps, "/b", 3);
  EXPECT_EQ(scanned(world, {"Apps"}), "kytAppsSize=2 startupDiskKytAppsSize=2");
}

}  // namespace
}  // namespace norvex
