#include <gmock/gmock.h>

#include <cerrno>

#include "scanner/NVXScanner.h"
#include "tests/support/TestPlatform.h"

namespace norvex {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;

// What the three handlers are given, one line a call: "package 1 /t/A.app", "file 2 5 /t/A.app/x".
std::vector<std::string> detail(const std::string& root) {
  std::vector<std::string> lines;
  NVXScanner().scanDirectoryInDetail(
      Location::folder(root),
      [&](const Location& location, std::uint64_t depth) {
        lines.push_back("package " + std::to_string(depth) + " " + location.path());
      },
      [&](const Location& location, std::uint64_t depth) {
        lines.push_back("folder " + std::to_string(depth) + " " + location.path());
      },
      [&](const Location& location, std::uint64_t depth, std::optional<std::uint64_t> size) {
        lines.push_back("file " + std::to_string(depth) + " " + (size ? std::to_string(*size) : "absent") +
                        " " + location.path());
      });
  return lines;
}

TEST(ScanDirectoryInDetail, HandsEachItemToTheHandlerOfItsKind) {
  TestPlatform world;
  world.files.put("/", folder("t", {package("A.app", {file("x", 5), file("y", 6)}),
                                    folder("b", {file(".h", 7)}), link("l", "/t/b", 4)}));
  EXPECT_THAT(detail("/t"), ElementsAre("package 1 /t/A.app", "file 2 5 /t/A.app/x", "file 2 6 /t/A.app/y",
                                        "folder 1 /t/b", "file 2 7 /t/b/.h", "file 1 4 /t/l"));
  EXPECT_THAT(world.systemLog.lines, IsEmpty());
}

TEST(ScanDirectoryInDetail, DescendsIntoPackagesWithinPackages) {
  TestPlatform world;
  world.files.put("/", folder("t", {package("A.app", {folder("c", {package("B.app", {file("x", 1)})})})}));
  EXPECT_THAT(detail("/t"), ElementsAre("package 1 /t/A.app", "folder 2 /t/A.app/c",
                                        "package 3 /t/A.app/c/B.app", "file 4 1 /t/A.app/c/B.app/x"));
}

TEST(ScanDirectoryInDetail, NamesItsThreeKeysInTheirOrder) {
  TestPlatform world;
  detail("/t");
  EXPECT_THAT(world.directoryEnumeration.walks.at(0).prefetch,
              ElementsAre(ResourceKey::FileSize, ResourceKey::IsDirectory, ResourceKey::IsPackage));
}

TEST(ScanDirectoryInDetail, AsksForThePackageThenTheFolderThenTheSize) {
  TestPlatform world;
  world.files.put("/", folder("t", {file("x", 1)}));
  detail("/t");
  EXPECT_THAT(world.calls.of({"value"}),
              ElementsAre("value IsPackage /t/x", "value IsDirectory /t/x", "value TotalFileSize /t/x"));
}

TEST(ScanDirectoryInDetail, GivesAnAbsentSizeToTheFileHandler) {
  TestPlatform world;
  world.files.put("/", folder("t", {file("x", 5).withoutTotalSize()}));
  EXPECT_THAT(detail("/t"), ElementsAre("file 1 absent /t/x"));
  EXPECT_THAT(world.systemLog.lines, IsEmpty());
}

TEST(ScanDirectoryInDetail, GoesOnAfterEveryFailure) {
  const struct {
    const char* claim;
    TreeItem item;
    std::vector<std::string> handled;
    std::vector<std::string> lines;
  } rows[] = {
      {"a package question that fails means no package",
       package("i", {file("x", 1)}).failing(ResourceKey::IsPackage, EIO),
       {"folder 1 /t/i", "file 2 1 /t/i/x", "file 1 9 /t/z"},
       {"3 Failed to get QXURLIsPackageKey for file:///t/i/, error: Input/output error"}},
      {"an item of unknown kind is handed to nobody",
       file("i", 1).withoutAttributes(EACCES),
       {"file 1 9 /t/z"},
       {"3 Failed to get QXURLIsDirectoryKey for file:///t/i, error: Permission denied"}},
      {"a package of unknown kind is handed to nobody, its contents are",
       package("i", {file("x", 1)}).failing(ResourceKey::IsDirectory, EIO),
       {"file 2 1 /t/i/x", "file 1 9 /t/z"},
       {"3 Failed to get QXURLIsDirectoryKey for file:///t/i/, error: Input/output error"}},
      {"a file whose size fails is handed to nobody",
       file("i", 1).failing(ResourceKey::TotalFileSize, EIO),
       {"file 1 9 /t/z"},
       {"3 Failed to get QXURLTotalFileSize for file:///t/i, error: Input/output error"}},
      {"both questions fail, both say so",
       file("i", 1).failing(ResourceKey::IsPackage, EPERM).failing(ResourceKey::IsDirectory, EIO),
       {"file 1 9 /t/z"},
       {"3 Failed to get QXURLIsPackageKey for file:///t/i, error: Operation not permitted",
        "3 Failed to get QXURLIsDirectoryKey for file:///t/i, error: Input/output error"}},
      {"a folder that cannot be listed is itself handled",
       folder("i", {file("x", 1)}).unreadable(EACCES),
       {"folder 1 /t/i", "file 1 9 /t/z"},
       {"3 Failed to enumerate: file:///t/i/, error: Permission denied"}},
  };
  for (const auto& row : rows) {
    TestPlatform world;
    world.files.put("/", folder("t", {row.item, file("z", 9)}));
    EXPECT_EQ(detail("/t"), row.handled) << row.claim;
    EXPECT_EQ(world.systemLog.lines, row.lines) << row.claim;
  }
}

TEST(ScanDirectoryInDetail, OfAMissingFolderSaysSoOnce) {
  TestPlatform world;
  EXPECT_THAT(detail("/none"), IsEmpty());
  EXPECT_THAT(world.systemLog.lines,
              ElementsAre("3 Failed to enumerate: file:///none/, error: No such file or directory"));
}

TEST(ScanDirectoryInDetail, WalksAndLogsWithoutAnyHandler) {
  TestPlatform world;
  world.files.put("/", folder("t", {package("A.app", {file("x", 1)}), folder("b"), file("c", 1),
                                    file("d", 1).failing(ResourceKey::TotalFileSize, EIO)}));
  NVXScanner().scanDirectoryInDetail(Location::folder("/t"), nullptr, nullptr, nullptr);
  EXPECT_THAT(world.calls.of({"value"}),
              ::testing::IsSupersetOf(
                  {"value IsPackage /t/A.app/x", "value IsPackage /t/b", "value IsPackage /t/c"}));
  EXPECT_THAT(world.systemLog.lines,
              ElementsAre("3 Failed to get QXURLTotalFileSize for file:///t/d, error: Input/output error"));
}

TEST(ScanDirectoryInDetail, EachHandlerMayBeMissingAlone) {
  TestPlatform world;
  world.files.put("/", folder("t", {package("A.app"), folder("b"), file("c", 1)}));
  for (int missing = 0; missing < 3; ++missing) {
    int called = 0;
    const auto count = [&](const Location&, std::uint64_t) { ++called; };
    NVXScanner().scanDirectoryInDetail(
        Location::folder("/t"), missing == 0 ? PackageHandler() : count,
        missing == 1 ? DirectoryHandler() : count,
        missing == 2 ? FileHandler()
                     : [&](const Location&, std::uint64_t, std::optional<std::uint64_t>) { ++called; });
    EXPECT_EQ(called, 2) << "without handler " << missing;
  }
}

}  // namespace
}  // namespace norvex
