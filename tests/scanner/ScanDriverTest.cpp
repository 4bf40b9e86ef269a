#include <gmock/gmock.h>

#include "scanner/NVXScanner.h"
#include "tests/scanner/DebugLevelScope.h"
#include "tests/scanner/ScanWorld.h"

namespace norvex {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;

// --- the order of everything

TEST(Scan, MeasuresInItsOrder) {
  ScanWorld world({"/", "/V"});
  world.installation.isInternal = true;
  NVXScanner().scan();
  const std::vector<std::string> steps = world.calls.of(
      {"openBackupSettings", "closeBackupSettings", "itemAtPath", "attribute", "sysctl", "values", "value",
       "names", "enumerate", "makeReference", "volumeOf", "objectCounts", "startQuery", "isInternalInstall"});
  std::vector<std::string> expected = {
      "openBackupSettings",
      "closeBackupSettings",
      "itemAtPath /",
      "attribute kMDStoreLastHealthCheck /",
      "itemAtPath /V",
      "attribute kMDStoreLastHealthCheck /V",
      "openBackupSettings",
      "closeBackupSettings",
      "sysctl 6 2",
      "values VolumeTotalCapacity /",
      "value IsDirectory /Users/user/Downloads",
      "enumerate /Users/user/Downloads",
      "names /Users/user/Library/Mail/V2",
      "names /Users/user/Library/Mail/V3",
      "enumerate /Users/user/Library/Application Support/Handlink/Backup",
  };
  for (const std::string volume : {"/", "/V"}) {
    expected.push_back("makeReference " + volume);
    expected.push_back("volumeOf " + volume);
    expected.push_back("objectCounts " + volume);
    expected.push_back("values VolumeAvailableCapacity VolumeTotalCapacity " + volume);
    for (const char* predicate : queryPredicates) expected.push_back(std::string("startQuery ") + predicate);
    expected.push_back("itemAtPath " + volume);
    expected.push_back("attribute kMDStoreAccumulatedSizes " + volume);
  }
  expected.insert(expected.end(),
                  {"isInternalInstall", "enumerate /Users/user/Desktop", "enumerate /Users/user/Documents"});
  EXPECT_EQ(steps, expected);
  EXPECT_THAT(world.systemLog.lines, IsEmpty());
}

TEST(Scan, PreparesThePhotoLibrariesBetweenTheSecondAndTheThirdQuery) {
  ScanWorld world;
  world.files.put("/Users/user/Pictures", folder("Picara Library"));
  world.files.put("/Users/user/Pictures", folder("Lumvia Library"));
  world.files.put("/Users/user/Desktop", folder("Picara Library"));
  world.files.put("/Users/user/Documents", folder("Picara Library"));
  NVXScanner().scan();
  const std::vector<std::string> calls = world.calls.of({"startQuery", "exists"});
  ASSERT_EQ(calls.size(), 8U);
  EXPECT_TRUE(calls[2].starts_with("exists ")) << calls[2];
}

TEST(Scan, SearchesTheVolumeItself) {
  ScanWorld world({"/", "/Volumes/My Disk"});
  NVXScanner().scan();
  ASSERT_EQ(world.metadataIndex.queries.size(), 14U);
  for (std::size_t i = 0; i < 14; ++i) {
    const auto& query = world.metadataIndex.queries[i];
    EXPECT_EQ(query->predicate, queryPredicates[i % 7]);
    ASSERT_EQ(query->scopes.size(), 1U);
    EXPECT_EQ(query->scopes[0].urlText(), i < 7 ? "file:///" : "file:///Volumes/My%20Disk/");
  }
}

TEST(Scan, HoldsNoItemOfTheIndexWhenItIsDone) {
  ScanWorld world({"/", "/V"});
  NVXScanner().scan();
  EXPECT_EQ(world.metadataIndex.liveness->now, 0);
  EXPECT_EQ(world.metadataIndex.liveness->most, 1);
  EXPECT_EQ(world.backupSettings.openHandles, 0);
}

// --- readiness

TEST(Scan, IsRefusedBeforeAnythingIsMeasuredWhenAStoreHasNoHealthCheck) {
  for (const char* unready : {"/", "/V", "/W"}) {
    const DebugLevelScope level(1);
    ScanWorld world({"/", "/V", "/W"});
    world.metadataIndex.volumes[unready].hasHealthCheck = false;
    EXPECT_EQ(NVXScanner().scan(), nullptr) << unready;
    EXPECT_THAT(world.systemLog.lines, IsEmpty()) << unready;
    EXPECT_THAT(world.calls.of({"sysctl", "value", "values", "names", "enumerate", "makeReference",
                                "createQuery", "isInternalInstall"}),
                IsEmpty())
        << unready;
    const auto items = world.calls.of({"itemAtPath"});
    EXPECT_EQ(items.back(), std::string("itemAtPath ") + unready) << "nothing is asked after the refusal";
    EXPECT_EQ(world.metadataIndex.liveness->now, 0);
  }
}

TEST(Scan, PassesOverVolumesThatTheIndexHasNoItemFor) {
  ScanWorld world({"/", "/V"});
  world.metadataIndex.volumes["/"].hasItem = false;
  world.metadataIndex.volumes["/"].hasHealthCheck = false;
  world.holds("/", phoneApps, "/a.ipa", 5);
  world.volumeCatalog.countsOfVolume["/"] = {3, 2};
  EXPECT_EQ(figures(NVXScanner().scan(), {"kytApps", "totalSize", "allDisksTotalFilesCount"}),
            "totalSize=1200 kytAppsSize=5 allDisksTotalFilesCount=3");
  EXPECT_THAT(world.systemLog.lines, IsEmpty());
}

// --- a query that does not start

TEST(Scan, GivesNoRecordWhenAQueryDoesNotStart) {
  for (std::size_t position = 0; position < 7; ++position) {
    for (const char* volume : {"/", "/V"}) {
      ScanWorld world({"/", "/V"});
      world.installation.isInternal = true;
      world.metadataIndex.volumes[volume].refused = {queryPredicates[position]};
      EXPECT_EQ(NVXScanner().scan(), nullptr) << position;
      EXPECT_THAT(world.systemLog.lines, IsEmpty()) << position;
      EXPECT_EQ(world.metadataIndex.queries.size(), position + (std::string(volume) == "/" ? 1U : 8U));
      EXPECT_THAT(world.calls.of({"isInternalInstall", "logWithKeys"}), IsEmpty()) << position;
    }
  }
}

TEST(Scan, KeepsNothingOfAScanThatGaveNoRecord) {
  ScanWorld world;
  world.holds("/", phoneApps, "/a.ipa", 5);
  world.metadataIndex.volumes["/"].refused = {queryPredicates[virtualMachines]};
  NVXScanner scanner;
  EXPECT_EQ(scanner.scan(), nullptr);
  world.metadataIndex.volumes["/"].refused.clear();
  const std::string first = figures(scanner.scan(), {""});
  EXPECT_EQ(figures(scanner.scan(), {""}), first);
  EXPECT_THAT(first, ::testing::HasSubstr("kytAppsSize=5 "));
}

// --- the volume list

TEST(Scan, WithoutVolumesMeasuresTheHomeAndTheStartupDisk) {
  for (const bool listIsAbsent : {false, true}) {
    ScanWorld world(std::vector<std::string>{});
    world.resourceValues.capacities["/"] = {{ResourceKey::VolumeTotalCapacity, 1000}};
    world.files.put("/Users/user", folder("Downloads", {file("a", 5)}));
    world.backupSettings.content->automaticBackupsEnabled = true;
    world.backupSettings.content->destinations = {"d"};
    if (listIsAbsent) world.backupSettings.content->includedVolumes.reset();
    const auto record = NVXScanner().scan();
    EXPECT_EQ(figures(record, {""}),
              "startupDiskSize=1000 userDownloadsSize=5 chronelAutomaticBackupsEnabled=1 "
              "numberOfBackupDestinations=1");
    EXPECT_EQ(*record->hardwareModelIdentifier(), "Model1,1");
    EXPECT_THAT(world.calls.of({"itemAtPath", "createQuery", "makeReference"}), IsEmpty());
    EXPECT_THAT(world.systemLog.lines, IsEmpty());
  }
}

TEST(Scan, KnowsTheStartupVolumeByItsExactPathAlone) {
  for (const char* volume : {"/V", "//", "/.", ""}) {
    ScanWorld world({volume});
    world.resourceValues.capacities["/"] = {{ResourceKey::VolumeTotalCapacity, 5000}};
    world.volumeCatalog.countsOfVolume[volume] = {2, 1};
    world.metadataIndex.volumes[volume].accumulatedSizes = std::vector<std::int64_t>(18, 1);
    for (const char* predicate : queryPredicates) {
      world.metadataIndex.volumes[volume].matches[predicate] = {{"/f.mp3"}};
    }
    world.putFile("/f.mp3", 1);
    EXPECT_EQ(figures(NVXScanner().scan(), {"tartupDisk"}), "startupDiskSize=5000") << volume;
  }
}

TEST(Scan, CountsAVolumeThatIsListedTwiceTwice) {
  ScanWorld world({"/", "/"});
  world.volumeCatalog.countsOfVolume["/"] = {3, 2};
  world.holds("/", phoneApps, "/a.ipa", 5);
  world.metadataIndex.volumes["/"].accumulatedSizes->at(7) = 11;
  EXPECT_EQ(
      figures(NVXScanner().scan(), {""}),
      "totalSize=1200 startupDiskSize=1000 usedStartupDiskSize=1200 appsSize=22 startupDiskAppsSize=22 "
      "kytAppsSize=10 startupDiskKytAppsSize=10 userContentSize=1200 startupDiskUserContentSize=1200 "
      "startupDiskTotalFilesystemObjectCount=10 startupDiskTotalFilesCount=6 "
      "startupDiskTotalDirectoriesCount=4 allDisksTotalFilesystemObjectCount=10 allDisksTotalFilesCount=6 "
      "allDisksTotalDirectoriesCount=4");
  EXPECT_EQ(world.metadataIndex.queries.size(), 14U);
}

TEST(Scan, StartsEachVolumesCountersAtZero) {
  ScanWorld world({"/", "/V", "/W"});
  world.holds("/V", virtualMachines, "/V/a", 5);
  world.holds("/", virtualMachines, "/b", 7);
  EXPECT_EQ(figures(NVXScanner().scan(), {"irtualMachines"}),
            "virtualMachinesSize=12 startupDiskVirtualMachinesSize=7");
}

// --- debug lines

TEST(Scan, AnnouncesEachVolumeOnlyAtADebugLevelAboveZero) {
  for (const std::int64_t level : {-1, 0, 1}) {
    const DebugLevelScope scope(level);
    ScanWorld world({"/", "/Volumes/My Disk%s"});
    NVXScanner().scan();
    if (level > 0) {
      EXPECT_THAT(world.systemLog.lines, ElementsAre("5 Scanning '/'... | NVXScanner:465",
                                                     "5 Scanning '/Volumes/My Disk%s'... | NVXScanner:465"));
    } else {
      EXPECT_THAT(world.systemLog.lines, IsEmpty()) << level;
    }
  }
}

TEST(Scan, AnnouncesAVolumeBeforeItIsMeasured) {
  const DebugLevelScope scope(1);
  ScanWorld world;
  NVXScanner().scan();
  EXPECT_THAT(world.calls.of({"syslog", "makeReference"}),
              ElementsAre("syslog 5 Scanning '/'... | NVXScanner:465", "makeReference /"));
}

// --- derived figures

TEST(Scan, SubtractsPurchasesFromWhatIsInUseAndWrapsBelowZero) {
  const struct {
    std::uint64_t receipt;
    std::uint64_t song;
    std::uint64_t movie;
    const char* figures;
  } rows[] = {
      {100, 20, 3, "userContentSize=477 startupDiskUserContentSize=477"},
      {600, 0, 0, ""},
      {500, 100, 1, "userContentSize=18446744073709551615 startupDiskUserContentSize=18446744073709551615"},
      {0, 0, 700, "userContentSize=18446744073709551516 startupDiskUserContentSize=18446744073709551516"},
  };
  for (const auto& row : rows) {
    ScanWorld world;
    world.holds("/", receipts, "/a.app", row.receipt);
    world.holds("/", music, "/a.m4a", row.song, true);
    world.holds("/", movies, "/a.m4v", row.movie, true);
    EXPECT_EQ(figures(NVXScanner().scan(), {"serContentSize"}), row.figures);
  }
}

TEST(Scan, DerivesTheStartupDiskFromItsOwnPurchases) {
  ScanWorld world({"/", "/V"});
  world.holds("/", receipts, "/a.app", 1);
  world.holds("/V", receipts, "/V/a.app", 2);
  world.holds("/", music, "/a.m4a", 4, true);
  world.holds("/V", music, "/V/a.m4a", 8, true);
  world.holds("/", movies, "/a.m4v", 16, true);
  world.holds("/V", movies, "/V/a.m4v", 32, true);
  EXPECT_EQ(figures(NVXScanner().scan(), {"serContentSize"}),
            "userContentSize=1137 startupDiskUserContentSize=579");
}

}  // namespace
}  // namespace norvex
