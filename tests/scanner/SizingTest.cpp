#include <gmock/gmock.h>

#include <cerrno>
#include <limits>

#include "scanner/NVXScanner.h"
#include "tests/support/TestPlatform.h"

namespace norvex {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;

constexpr std::uint64_t kMost = std::numeric_limits<std::uint64_t>::max();

// --- one file

TEST(SizeForFile, IsTheTotalSizeOfAllStreams) {
  TestPlatform world;
  world.files.put("/", file("f", 12));
  EXPECT_EQ(NVXScanner().sizeForFile(Location::file("/f")), 12U);
  EXPECT_THAT(world.calls.all(), ElementsAre("value TotalFileSize /f"));
}

TEST(SizeForFile, IsZeroWithoutALineForWhatHasNoTotalSize) {
  TestPlatform world;
  world.files.put("/", folder("d", {file("x", 5)}));
  world.files.put("/", package("p.app", {file("x", 5)}));
  world.files.put("/", file("n", 5).withoutTotalSize());
  for (const char* path : {"/d", "/p.app", "/n"}) {
    EXPECT_EQ(NVXScanner().sizeForFile(Location::file(path)), 0U) << path;
  }
  EXPECT_THAT(world.systemLog.lines, IsEmpty());
}

TEST(SizeForFile, IsZeroWithALineForWhatCannotBeRead) {
  TestPlatform world;
  world.files.put("/", file("a b", 5).withoutAttributes(EACCES));
  EXPECT_EQ(NVXScanner().sizeForFile(Location::file("/a b")), 0U);
  EXPECT_EQ(NVXScanner().sizeForFile(Location::folder("/none")), 0U);
  EXPECT_THAT(
      world.systemLog.lines,
      ElementsAre("3 Failed to get QXURLTotalFileSize for file:///a%20b, error: Permission denied",
                  "3 Failed to get QXURLTotalFileSize for file:///none/, error: No such file or directory"));
}

TEST(SizeForFile, WritesALineWithPercentSignsAsItStands) {
  TestPlatform world;
  NVXScanner().sizeForFile(Location::file("/%n%s"));
  EXPECT_THAT(
      world.systemLog.lines,
      ElementsAre(
          "3 Failed to get QXURLTotalFileSize for file:///%25n%25s, error: No such file or directory"));
}

// --- a folder

TEST(SizeForDirectory, SumsTheFilesOfTheWholeTree) {
  const struct {
    const char* claim;
    TreeItem tree;
    std::uint64_t size;
  } rows[] = {
      {"an empty folder", folder("t"), 0},
      {"only subfolders", folder("t", {folder("a", {folder("b")}), folder("c")}), 0},
      {"hidden files count", folder("t", {file(".h", 3), folder(".d", {file("x", 4)})}), 7},
      {"package contents count", folder("t", {package("A.app", {folder("c", {file("x", 5)}), file("y", 6)})}),
       11},
      {"a link counts with its own size", folder("t", {link("l", "/big", 9)}), 9},
      {"files of every depth",
       folder("t", {file("a", 1), folder("b", {file("c", 2), folder("d", {file("e", 4)})})}), 7},
      {"the sum wraps", folder("t", {file("a", kMost), file("b", 3)}), 2},
      {"vanished items add nothing", folder("t", {file("a", 1), file("b", 2).vanishing()}), 1},
      {"files without a size add nothing", folder("t", {file("a", 1), file("b", 2).withoutTotalSize()}), 1},
  };
  for (const auto& row : rows) {
    TestPlatform world;
    world.files.put("/", row.tree);
    world.files.put("/", folder("big", {file("x", 1000)}));
    EXPECT_EQ(NVXScanner().sizeForDirectory(Location::folder("/t")), row.size) << row.claim;
    EXPECT_THAT(world.systemLog.lines, IsEmpty()) << row.claim;
  }
}

TEST(SizeForDirectory, NamesItsKeysToTheWalkInAdvance) {
  TestPlatform world;
  NVXScanner().sizeForDirectory(Location::folder("/t"));
  ASSERT_EQ(world.directoryEnumeration.walks.size(), 1U);
  EXPECT_THAT(world.directoryEnumeration.walks[0].prefetch,
              ElementsAre(ResourceKey::TotalFileSize, ResourceKey::IsDirectory));
}

TEST(SizeForDirectory, AsksTheSizeOfEveryItemFoldersIncluded) {
  TestPlatform world;
  world.files.put("/", folder("t", {folder("a", {file("x", 1)}), file("b", 2)}));
  NVXScanner().sizeForDirectory(Location::folder("/t"));
  EXPECT_THAT(world.calls.all(), ElementsAre("enumerate /t", "value TotalFileSize /t/a",
                                             "value TotalFileSize /t/a/x", "value TotalFileSize /t/b"));
}

TEST(SizeForDirectory, GoesOnPastWhatItCannotRead) {
  TestPlatform world;
  world.files.put("/", folder("t", {folder("closed", {file("x", 100)}).unreadable(EACCES), file("a", 1),
                                    file("bad", 50).withoutAttributes(EIO), file("z", 2)}));
  EXPECT_EQ(NVXScanner().sizeForDirectory(Location::folder("/t")), 3U);
  EXPECT_THAT(world.systemLog.lines,
              ElementsAre("3 Failed to get QXURLTotalFileSize for file:///t/bad, error: Input/output error",
                          "3 Failed to enumerate: file:///t/closed/, error: Permission denied"));
}

TEST(SizeForDirectory, OfAMissingFolderIsZeroWithOneLine) {
  TestPlatform world;
  EXPECT_EQ(NVXScanner().sizeForDirectory(Location::folder("/none")), 0U);
  EXPECT_THAT(world.systemLog.lines,
              ElementsAre("3 Failed to enumerate: file:///none/, error: No such file or directory"));
}

// --- either

TEST(SizeForURL, MeasuresByWhatLiesThere) {
  const struct {
    const char* claim;
    TreeItem item;
    std::uint64_t size;
    bool walks;
  } rows[] = {
      {"a file", file("i", 8), 8, false},
      {"a folder", folder("i", {file("x", 3), file("y", 4)}), 7, true},
      {"a package is walked", package("i", {file("x", 3), folder("c", {file("y", 4)})}), 7, true},
      {"a link to a folder is not followed", link("i", "/big", 4), 4, false},
  };
  for (const auto& row : rows) {
    TestPlatform world;
    world.files.put("/", folder("big", {file("x", 1000)}));
    world.files.put("/", row.item);
    EXPECT_EQ(NVXScanner().sizeForURL(Location::file("/i")), row.size) << row.claim;
    EXPECT_EQ(world.directoryEnumeration.walks.size(), row.walks ? 1U : 0U) << row.claim;
    EXPECT_THAT(world.systemLog.lines, IsEmpty()) << row.claim;
  }
}

TEST(SizeForURL, OfWhatIsNotThereIsZeroWithTheLineOfTheFirstQuestion) {
  TestPlatform world;
  EXPECT_EQ(NVXScanner().sizeForURL(Location::file("/none")), 0U);
  EXPECT_THAT(
      world.systemLog.lines,
      ElementsAre("3 Failed to get QXURLIsDirectoryKey for file:///none, error: No such file or directory"));
  EXPECT_THAT(world.calls.of({"value", "enumerate"}), ElementsAre("value IsDirectory /none"));
}

TEST(SizeForURL, IsZeroWhenOnlyTheKindCannotBeRead) {
  TestPlatform world;
  world.files.put("/", file("i", 8).failing(ResourceKey::IsDirectory, EIO));
  EXPECT_EQ(NVXScanner().sizeForURL(Location::file("/i")), 0U);
  EXPECT_THAT(world.systemLog.lines,
              ElementsAre("3 Failed to get QXURLIsDirectoryKey for file:///i, error: Input/output error"));
}

TEST(SizeForURL, OfAFileWhoseSizeCannotBeReadIsZeroWithTheSizeLine) {
  TestPlatform world;
  world.files.put("/", file("i", 8).failing(ResourceKey::TotalFileSize, EIO));
  EXPECT_EQ(NVXScanner().sizeForURL(Location::file("/i")), 0U);
  EXPECT_THAT(world.systemLog.lines,
              ElementsAre("3 Failed to get QXURLTotalFileSize for file:///i, error: Input/output error"));
}

// --- several paths

std::uint64_t sizeOfList(const std::vector<std::string>& paths) {
  return NVXScanner().sizeForPaths(std::span<const std::string>(paths));
}

TEST(SizeForPaths, SumsListsAndSets) {
  TestPlatform world;
  world.files.put("/", file("a", 5));
  world.files.put("/", folder("d", {file("x", 7)}));
  world.files.put("/", file("most", kMost));
  const struct {
    std::vector<std::string> paths;
    std::uint64_t asList;
    std::uint64_t asSet;
  } rows[] = {
      {{}, 0, 0},
      {{"/a"}, 5, 5},
      {{"/a", "/d"}, 12, 12},
      {{"/a", "/a"}, 10, 5},
      {{"/d", "/a", "/d"}, 19, 12},
      {{"/a", "/most"}, 4, 4},
  };
  for (const auto& row : rows) {
    EXPECT_EQ(sizeOfList(row.paths), row.asList);
    EXPECT_EQ(NVXScanner().sizeForPaths(std::set<std::string>(row.paths.begin(), row.paths.end())),
              row.asSet);
  }
  EXPECT_THAT(world.systemLog.lines, IsEmpty());
}

TEST(SizeForPaths, KeepsTheOrderOfAList) {
  TestPlatform world;
  for (const char* name : {"a", "b", "c"}) world.files.put("/", file(name, 1));
  sizeOfList({"/c", "/a", "/b"});
  EXPECT_THAT(world.calls.all(),
              ElementsAre("value IsDirectory /c", "value TotalFileSize /c", "value IsDirectory /a",
                          "value TotalFileSize /a", "value IsDirectory /b", "value TotalFileSize /b"));
}

TEST(SizeForPaths, CountsAMissingPathAsZeroWithALine) {
  TestPlatform world;
  world.files.put("/", file("a", 5));
  EXPECT_EQ(sizeOfList({"/none", "/a"}), 5U);
  EXPECT_THAT(
      world.systemLog.lines,
      ElementsAre("3 Failed to get QXURLIsDirectoryKey for file:///none, error: No such file or directory"));
}

}  // namespace
}  // namespace norvex
