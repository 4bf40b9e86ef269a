#include <gmock/gmock.h>

#include "scanner/NVXScanner.h"
#include "tests/scanner/ScanWorld.h"

namespace norvex {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;

const Location kVolume = Location::folder("/Volumes/My Disk");

ResourceValueTable capacities(std::optional<std::uint64_t> total, std::optional<std::uint64_t> available) {
  ResourceValueTable table;
  if (total) table[ResourceKey::VolumeTotalCapacity] = *total;
  if (available) table[ResourceKey::VolumeAvailableCapacity] = *available;
  return table;
}

TEST(VolumeCapacity, IsComputedFromTotalAndAvailable) {
  const struct {
    const char* claim;
    std::optional<std::uint64_t> total;
    std::optional<std::uint64_t> available;
    std::uint64_t totalCapacity;
    std::uint64_t used;
    std::vector<std::string> lines;
  } rows[] = {
      {"part is used", 1000, 400, 1000, 600, {}},
      {"all is used", 1000, 0, 1000, 1000, {}},
      {"no available key means none", 1000, std::nullopt, 1000, 1000, {}},
      {"nothing is used",
       400,
       400,
       400,
       0,
       {"3 Available capacity (400) larger then total capacity (400) on volume file:///Volumes/My%20Disk/"}},
      {"more is free than there is",
       400,
       1000,
       400,
       0,
       {"3 Available capacity (1000) larger then total capacity (400) on volume file:///Volumes/My%20Disk/"}},
      {"no total key means 0",
       std::nullopt,
       7,
       0,
       0,
       {"3 Available capacity (7) larger then total capacity (0) on volume file:///Volumes/My%20Disk/"}},
      {"neither key",
       std::nullopt,
       std::nullopt,
       0,
       0,
       {"3 Available capacity (0) larger then total capacity (0) on volume file:///Volumes/My%20Disk/"}},
      {"figures above 2^63", 18446744073709551615U, 1, 18446744073709551615U, 18446744073709551614U, {}},
      {"a difference above 2^63 is no error",
       1,
       18446744073709551615U,
       1,
       0,
       {"3 Available capacity (18446744073709551615) larger then total capacity (1) on volume "
        "file:///Volumes/My%20Disk/"}},
  };
  for (const auto& row : rows) {
    TestPlatform world;
    world.resourceValues.capacities[kVolume.path()] = capacities(row.total, row.available);
    EXPECT_EQ(NVXScanner().totalCapacityOnVolume(kVolume), row.totalCapacity) << row.claim;
    EXPECT_THAT(world.systemLog.lines, IsEmpty()) << row.claim;
    EXPECT_EQ(NVXScanner().usedCapacityOnVolume(kVolume), row.used) << row.claim;
    EXPECT_EQ(world.systemLog.lines, row.lines) << row.claim;
  }
}

TEST(VolumeCapacity, IsAskedForInOneRequest) {
  TestPlatform world;
  world.resourceValues.capacities[kVolume.path()] = capacities(2, 1);
  NVXScanner().totalCapacityOnVolume(kVolume);
  NVXScanner().usedCapacityOnVolume(kVolume);
  EXPECT_THAT(world.calls.all(),
              ElementsAre("values VolumeTotalCapacity /Volumes/My Disk",
                          "values VolumeAvailableCapacity VolumeTotalCapacity /Volumes/My Disk"));
}

TEST(VolumeCapacity, IsZeroWithOneLineEachWhenItCannotBeRead) {
  TestPlatform world;
  EXPECT_EQ(NVXScanner().totalCapacityOnVolume(kVolume), 0U);
  EXPECT_EQ(NVXScanner().usedCapacityOnVolume(kVolume), 0U);
  const std::string line =
      "3 Failed to get resource values for file:///Volumes/My%20Disk/, error: No such file or directory";
  EXPECT_THAT(world.systemLog.lines, ElementsAre(line, line));
}

// --- object counts

std::string counted(const NVXScannerResults& results) {
  return figures(&results, {"Count"});
}

TEST(ObjectCounts, GoToAllDisksAndOnTheStartupDiskToItsOwnToo) {
  const struct {
    bool isStartupDisk;
    const char* figures;
  } rows[] = {
      {false,
       "allDisksTotalFilesystemObjectCount=12 allDisksTotalFilesCount=9 allDisksTotalDirectoriesCount=3"},
      {true,
       "startupDiskTotalFilesystemObjectCount=12 startupDiskTotalFilesCount=9 "
       "startupDiskTotalDirectoriesCount=3 "
       "allDisksTotalFilesystemObjectCount=12 allDisksTotalFilesCount=9 allDisksTotalDirectoriesCount=3"},
  };
  for (const auto& row : rows) {
    TestPlatform world;
    world.volumeCatalog.countsOfVolume[kVolume.path()] = {9, 3};
    NVXScannerResults results;
    NVXScanner().computeFileSystemObjectCounts(results, kVolume, row.isStartupDisk);
    EXPECT_EQ(counted(results), row.figures);
  }
}

TEST(ObjectCounts, SumObjectsIn32BitsAndTheRestIn64) {
  TestPlatform world;
  world.volumeCatalog.countsOfVolume[kVolume.path()] = {3'000'000'000U, 2'000'000'000U};
  NVXScannerResults results;
  NVXScanner().computeFileSystemObjectCounts(results, kVolume, true);
  NVXScanner().computeFileSystemObjectCounts(results, kVolume, false);
  EXPECT_EQ(counted(results),
            "startupDiskTotalFilesystemObjectCount=705032704 startupDiskTotalFilesCount=3000000000 "
            "startupDiskTotalDirectoriesCount=2000000000 allDisksTotalFilesystemObjectCount=1410065408 "
            "allDisksTotalFilesCount=6000000000 allDisksTotalDirectoriesCount=4000000000");
}

TEST(ObjectCounts, AddToWhatTheRecordHoldsAndWrap) {
  TestPlatform world;
  world.volumeCatalog.countsOfVolume[kVolume.path()] = {4, 1};
  NVXScannerResults results;
  results.setAllDisksTotalFilesCount(18446744073709551615U);
  results.setAllDisksTotalFilesystemObjectCount(100);
  NVXScanner().computeFileSystemObjectCounts(results, kVolume, false);
  EXPECT_EQ(
      counted(results),
      "allDisksTotalFilesystemObjectCount=105 allDisksTotalFilesCount=3 allDisksTotalDirectoriesCount=1");
}

TEST(ObjectCounts, AreLeftAloneSilentlyWhenAStepFails) {
  using Step = InMemoryVolumeCatalog::Step;
  const struct {
    Step failingStep;
    std::size_t stepsMade;
  } rows[] = {{Step::makeReference, 1}, {Step::volumeOf, 2}, {Step::objectCounts, 3}};
  for (const auto& row : rows) {
    TestPlatform world;
    world.volumeCatalog.countsOfVolume[kVolume.path()] = {9, 3};
    world.volumeCatalog.failingStep = row.failingStep;
    NVXScannerResults results;
    NVXScanner().computeFileSystemObjectCounts(results, kVolume, true);
    EXPECT_EQ(counted(results), "");
    EXPECT_EQ(world.calls.all().size(), row.stepsMade);
    EXPECT_THAT(world.systemLog.lines, IsEmpty());
  }
}

TEST(ObjectCounts, OfAPathThatTheCatalogDoesNotKnowChangeNothing) {
  TestPlatform world;
  NVXScannerResults results;
  NVXScanner().computeFileSystemObjectCounts(results, kVolume, true);
  EXPECT_EQ(counted(results), "");
  EXPECT_THAT(world.systemLog.lines, IsEmpty());
}

}  // namespace
}  // namespace norvex
