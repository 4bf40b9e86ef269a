// The scan's sources outside the queries: backup settings, model, capacities, fixed folders, the store's
// totals.
#include <gmock/gmock.h>

#include <cerrno>

#include "scanner/NVXScanner.h"
#include "tests/scanner/ScanWorld.h"

namespace norvex {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;

// --- backup settings and model

TEST(Scan, TakesTheBackupSettings) {
  ScanWorld world;
  world.backupSettings.content->destinations = {"a", "b", "c"};
  world.backupSettings.content->systemFilesSkipped = true;
  const auto record = NVXScanner().scan();
  EXPECT_FALSE(record->chronelAutomaticBackupsEnabled());
  EXPECT_EQ(record->numberOfBackupDestinations(), 3U);
  EXPECT_TRUE(record->chronelSystemFilesSkipped());
}

TEST(Scan, KeepsTheInitialSettingsWithoutBackupSettings) {
  ScanWorld world;
  world.backupSettings.content.reset();
  const auto record = NVXScanner().scan();
  ASSERT_NE(record, nullptr);
  EXPECT_FALSE(record->chronelAutomaticBackupsEnabled());
  EXPECT_EQ(record->numberOfBackupDestinations(), 0U);
  EXPECT_FALSE(record->chronelSystemFilesSkipped());
  EXPECT_EQ(record->totalSize(), 0U);
  EXPECT_THAT(world.systemLog.lines, IsEmpty());
}

TEST(Scan, LeavesAnUnknownModelAbsent) {
  ScanWorld world;
  world.systemControl.failure = ENOENT;
  const auto record = NVXScanner().scan();
  ASSERT_NE(record, nullptr);
  EXPECT_EQ(record->hardwareModelIdentifier(), nullptr);
  EXPECT_THAT(world.systemLog.lines, ElementsAre("3 Error finding model-id, errno: 2"));
}

// --- capacities

TEST(Scan, AddsTheUsedCapacityOfEveryVolume) {
  ScanWorld world({"/V", "/", "/W"});
  world.resourceValues.capacities["/V"][ResourceKey::VolumeAvailableCapacity] = 990;
  world.resourceValues.capacities["/W"][ResourceKey::VolumeAvailableCapacity] = 2000;
  EXPECT_EQ(figures(NVXScanner().scan(), {"totalSize", "tartupDiskSize"}),
            "totalSize=610 startupDiskSize=1000 usedStartupDiskSize=600");
  EXPECT_THAT(
      world.systemLog.lines,
      ElementsAre("3 Available capacity (2000) larger then total capacity (1000) on volume file:///W/"));
}

TEST(Scan, GoesOnWithoutCapacitiesAndCounts) {
  ScanWorld world({"/V"});
  world.resourceValues.capacities.erase("/V");
  world.volumeCatalog.failingStep = InMemoryVolumeCatalog::Step::objectCounts;
  world.holds("/V", phoneApps, "/a.ipa", 5);
  EXPECT_EQ(figures(NVXScanner().scan(), {""}), "kytAppsSize=5");
  EXPECT_THAT(
      world.systemLog.lines,
      ElementsAre("3 Failed to get resource values for file:///V/, error: No such file or directory"));
}

// --- the fixed folders

TEST(Scan, MeasuresTheFixedFolders) {
  ScanWorld world;
  world.files.put("/Users/user", folder("Downloads", {file("a", 1), package("p.app", {file("b", 2)})}));
  world.files.put("/Users/user/Library/Application Support/Handlink",
                  folder("Backup", {folder("phone", {file("c", 4)})}));
  // Mail is measured beside the layout folder that names it.
  world.files.put("/Users/user/Library", folder("Mail", {folder("V2", {folder("IMAP-x", {file("m", 8)})}),
                                                         folder("IMAP-x", {file("m", 16)})}));
  EXPECT_EQ(figures(NVXScanner().scan(), {"userDownloads", "userImap", "userKyt"}),
            "userDownloadsSize=3 userImapEmailSize=16 userKytBackupSize=4");
  EXPECT_THAT(world.systemLog.lines, IsEmpty());
}

TEST(Scan, SaysWhichFixedFoldersAreMissing) {
  ScanWorld world;
  world.files = InMemoryFileTree();
  world.files.put("/Users/user/Library/Mail/V3", folder("IMAP-x", {file("m", 8)}));
  ASSERT_NE(NVXScanner().scan(), nullptr);
  EXPECT_THAT(
      world.systemLog.lines,
      ElementsAre(
          "3 Failed to get QXURLIsDirectoryKey for file:///Users/user/Downloads/, error: No such file or "
          "directory",
          "3 Failed to get QXURLIsDirectoryKey for file:///Users/user/Library/Mail/IMAP-x, error: No such "
          "file or directory",
          "3 Failed to enumerate: file:///Users/user/Library/Application%20Support/Handlink/Backup/, "
          "error: No such file or directory"));
}

TEST(Scan, TakesALinkInPlaceOfDownloadsAsALink) {
  ScanWorld world;
  world.files.put("/", folder("big", {file("x", 1000)}));
  world.files.put("/Users/user", link("Downloads", "/big", 4));
  EXPECT_EQ(figures(NVXScanner().scan(), {"userDownloads"}), "userDownloadsSize=4");
}

// --- the store's totals

TEST(StoreTotals, GoToTheFigureOfTheirPosition) {
  const char* figureOfPosition[] = {"messagesSize", "otherSize",     "otherSize",     "otherSize",
                                    "otherSize",    "otherSize",     "moviesSize",    "appsSize",
                                    nullptr,        "musicSize",     "documentsSize", "documentsSize",
                                    "imagesSize",   "documentsSize", "documentsSize", "documentsSize",
                                    nullptr,        "otherSize",     nullptr};
  const std::initializer_list<std::string_view> totals = {
      "messagesSize",  "otherSize",     "moviesSize",        "appsSize",      "musicSize",
      "documentsSize", "imagesSize",    "DiskMessagesSize",  "DiskOtherSize", "DiskMoviesSize",
      "DiskAppsSize",  "DiskMusicSize", "DiskDocumentsSize", "DiskImagesSize"};
  for (std::size_t position = 0; position < std::size(figureOfPosition); ++position) {
    for (const std::string volume : {"/", "/V"}) {
      ScanWorld world({volume});
      world.metadataIndex.volumes[volume].accumulatedSizes = std::vector<std::int64_t>(19, 0);
      world.metadataIndex.volumes[volume].accumulatedSizes->at(position) = 5;
      std::string expected;
      if (const char* name = figureOfPosition[position]) {
        expected = std::string(name) + "=5";
        if (volume == "/") {
          std::string capitalised = name;
          capitalised[0] = static_cast<char>(capitalised[0] - 'a' + 'A');
          expected += " startupDisk" + capitalised + "=5";
        }
      }
      EXPECT_EQ(figures(NVXScanner().scan(), totals), expected) << position;
      EXPECT_THAT(world.systemLog.lines, IsEmpty());
    }
  }
}

TEST(StoreTotals, CountOnlyNumbersAboveZero) {
  const struct {
    std::int64_t number;
    const char* figures;
  } rows[] = {
      {1, "otherSize=1"}, {0, ""}, {-1, ""}, {INT64_MIN, ""}, {INT64_MAX, "otherSize=9223372036854775807"},
  };
  for (const auto& row : rows) {
    ScanWorld world({"/V"});
    world.metadataIndex.volumes["/V"].accumulatedSizes->at(3) = row.number;
    EXPECT_EQ(figures(NVXScanner().scan(), {"otherSize"}), row.figures) << row.number;
  }
}

TEST(StoreTotals, SumPositionsOfOneFigureAndWrap) {
  ScanWorld world({"/V"});
  for (const std::size_t position : {1U, 5U, 17U}) {
    world.metadataIndex.volumes["/V"].accumulatedSizes->at(position) = INT64_MAX;
  }
  EXPECT_EQ(figures(NVXScanner().scan(), {"otherSize"}), "otherSize=9223372036854775805");
}

TEST(StoreTotals, TakeMissingPositionsAsAbsent) {
  const char* atLength[] = {"",  // 0
                            "messagesSize=2", "messagesSize=2 otherSize=2"};
  for (std::size_t length = 0; length < std::size(atLength); ++length) {
    ScanWorld world({"/V"});
    world.metadataIndex.volumes["/V"].accumulatedSizes = std::vector<std::int64_t>(length, 2);
    EXPECT_EQ(figures(NVXScanner().scan(), {"messagesSize", "otherSize", "documentsSize"}), atLength[length]);
    EXPECT_THAT(world.systemLog.lines, IsEmpty());
  }
  ScanWorld world({"/V"});
  world.metadataIndex.volumes["/V"].accumulatedSizes = std::vector<std::int64_t>(17, 2);
  EXPECT_EQ(figures(NVXScanner().scan(), {"otherSize", "documentsSize"}), "documentsSize=10 otherSize=10");
}

TEST(StoreTotals, ThatAreAbsentAreToldByALineThatSpeaksOfTheItem) {
  ScanWorld world({"/Volumes/My Disk", "/V"});
  world.metadataIndex.volumes["/Volumes/My Disk"].accumulatedSizes.reset();
  world.metadataIndex.volumes["/V"].accumulatedSizes->at(7) = 5;
  world.holds("/Volumes/My Disk", phoneApps, "/a.ipa", 6);
  EXPECT_EQ(figures(NVXScanner().scan(), {"appsSize", "kytApps"}), "appsSize=5 kytAppsSize=6");
  EXPECT_THAT(world.systemLog.lines, ElementsAre("3 IdxItemCreate returned NULL for path: /Volumes/My Disk"));
}

TEST(StoreTotals, OfAVolumeWithoutAnItemArePassedOverSilently) {
  ScanWorld world({"/V"});
  world.metadataIndex.volumes["/V"].hasItem = false;
  EXPECT_NE(NVXScanner().scan(), nullptr);
  EXPECT_THAT(world.systemLog.lines, IsEmpty());
}

}  // namespace
}  // namespace norvex
