// What walks yield, in which order and with which facts.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <array>
#include <cstdio>

#include "platform/linux/LinuxDirectoryEnumeration.h"
#include "platform/linux/LinuxResourceValues.h"
#include "tests/linux/walk/RecordedWalk.h"
#include "tests/support/TreeOnDisk.h"

namespace norvex {
namespace {

using ondisk::fifo;
using ondisk::file;
using ondisk::folder;
using ondisk::hardLink;
using ondisk::link;
using ondisk::Medium;
using ondisk::TreeOnDisk;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::UnorderedElementsAre;

TEST(DirectoryEnumeration, YieldsAFolderBeforeItsContentsAndSiblingsInByteOrder) {
  const TreeOnDisk tree({file("b.txt"), folder("b", {file("z"), folder("a", {file("deep")})}), file("B"),
                         file("b-1"), file("\xC3\xA4"), file("a")});
  EXPECT_THAT(walk(tree.location()).paths,
              ElementsAre("B", "a", "b", "b/a", "b/a/deep", "b/z", "b-1", "b.txt", "\xC3\xA4"));
}

TEST(DirectoryEnumeration, OrdersNamesThatBeginAlikeByTheirRest) {
  const TreeOnDisk tree({file("IMG_00000001.jpg"), file("IMG_00000001"), file("IMG_0000000100000000b"),
                         file("IMG_0000000100000000a"), file("IMG_00000000"), file("IMG_00000001\xFF")});
  EXPECT_THAT(walk(tree.location()).paths,
              ElementsAre("IMG_00000000", "IMG_00000001", "IMG_00000001.jpg", "IMG_0000000100000000a",
                          "IMG_0000000100000000b", "IMG_00000001\xFF"));
}

TEST(DirectoryEnumeration, CountsLevelsFromOne) {
  const TreeOnDisk tree({folder("a", {folder("b", {file("c")})}), folder("d", {folder("e")}), file("f")});
  const RecordedWalk record = walk(tree.location());
  EXPECT_THAT(record.paths, ElementsAre("a", "a/b", "a/b/c", "d", "d/e", "f"));
  EXPECT_THAT(record.levels, ElementsAre(1, 2, 3, 1, 2, 1));
}

TEST(DirectoryEnumeration, YieldsHiddenItemsAndTheirContents) {
  const TreeOnDisk tree({file(".hidden"), folder(".folder", {file(".inside")}), file("..twice")});
  EXPECT_THAT(walk(tree.location()).paths, ElementsAre("..twice", ".folder", ".folder/.inside", ".hidden"));
}

TEST(DirectoryEnumeration, YieldsNothingOfAnEmptyFolder) {
  const TreeOnDisk tree;
  const RecordedWalk record = walk(tree.location());
  EXPECT_THAT(record.paths, IsEmpty());
  EXPECT_THAT(record.errors, IsEmpty());
}

TEST(DirectoryEnumeration, YieldsLinksAsThemselvesAndFollowsNone) {
  const TreeOnDisk other({file("outside", 1000)});
  const TreeOnDisk tree({folder("real", {file("x", 5)}), link("toFile", "real/x"), link("toFolder", "real"),
                         link("away", other.path()), link("dangling", "missing"), link("loopA", "loopB"),
                         link("loopB", "loopA"), link("self", "."), link("up", "..")});
  const RecordedWalk record = walk(tree.location());
  EXPECT_THAT(record.paths, ElementsAre("away", "dangling", "loopA", "loopB", "real", "real/x", "self",
                                        "toFile", "toFolder", "up"));
  EXPECT_THAT(record.errors, IsEmpty());
  // A link's own size is the length of its text.
  EXPECT_EQ(record.totalSize, 5 + other.path().size() + 7 + 5 + 5 + 1 + 6 + 4 + 2);
}

TEST(DirectoryEnumeration, YieldsPipesAsFilesWithoutOpeningThem) {
  const TreeOnDisk tree({fifo("pipe")});
  const RecordedWalk record = walk(tree.location());
  EXPECT_THAT(record.paths, ElementsAre("pipe"));
  EXPECT_FALSE(record.locations[0].facts()->isDirectory);
}

TEST(DirectoryEnumeration, CountsAFileUnderEachOfItsNames) {
  const TreeOnDisk tree({file("a", 100), hardLink("b", "a"), folder("c", {hardLink("d", "a")})});
  EXPECT_EQ(walk(tree.location()).totalSize, 300u);
}

TEST(DirectoryEnumeration, TakesTheLogicalSizeOfASparseFile) {
  constexpr std::uint64_t kTebibyte = std::uint64_t{1} << 40U;
  const TreeOnDisk tree({file("disk.img", kTebibyte), file("one", 1)});
  EXPECT_EQ(walk(tree.location()).totalSize, kTebibyte + 1);
}

TEST(DirectoryEnumeration, YieldsNamesThatAreNoText) {
  const TreeOnDisk tree({folder("\xFF\xFE", {file("line\nbreak"), file("\xE9t\xE9")}), file("tab\t"),
                         file("-rf"), file(std::string(255, 'x'))});
  EXPECT_THAT(walk(tree.location()).paths, ElementsAre("-rf", "tab\t", std::string(255, 'x'), "\xFF\xFE",
                                                       "\xFF\xFE/line\nbreak", "\xFF\xFE/\xE9t\xE9"));
}

TEST(DirectoryEnumeration, MarksFoldersAmongItsLocations) {
  const TreeOnDisk tree({folder("a b", {file("c")}), link("l", "a b")});
  const RecordedWalk record = walk(tree.location());
  EXPECT_EQ(record.locations[0].urlText(), "file://" + tree.path() + "/a%20b/");
  EXPECT_EQ(record.locations[1].urlText(), "file://" + tree.path() + "/a%20b/c");
  EXPECT_EQ(record.locations[2].urlText(), "file://" + tree.path() + "/l");
}

TEST(DirectoryEnumeration, TakesARootThatEndsInASeparator) {
  const TreeOnDisk tree({folder("a", {file("b")})});
  const RecordedWalk record = walk(Location::folder(tree.path() + "/"));
  EXPECT_THAT(record.paths, ElementsAre("a", "a/b"));
  EXPECT_EQ(record.locations[1].path(), tree.path() + "/a/b");
}

TEST(DirectoryEnumeration, TellsOnceOfARootThatIsNoFolder) {
  const TreeOnDisk tree({file("file"), folder("folder", {file("x")}), link("link", "folder")});
  struct Case {
    std::string root;
    int error;
  };
  for (const Case& given : {Case{"missing", ENOENT}, Case{"file", ENOTDIR}, Case{"link", ENOTDIR},
                            Case{"link/", ENOTDIR}, Case{"file/below", ENOTDIR}}) {
    SCOPED_TRACE(given.root);
    const RecordedWalk record = walk(Location::folder(tree.path(given.root)));
    EXPECT_THAT(record.paths, IsEmpty());
    EXPECT_THAT(record.errors, ElementsAre(".: " + std::to_string(given.error)));
  }
}

TEST(DirectoryEnumeration, SurvivesWithoutAnErrorHandler) {
  const TreeOnDisk tree;
  LinuxDirectoryEnumeration enumeration;
  const auto walking = enumeration.enumerator(Location::folder(tree.path("missing")), {}, nullptr);
  EXPECT_EQ(walking->next(), nullptr);
  EXPECT_EQ(walking->next(), nullptr);
}

TEST(DirectoryEnumeration, ListsAFolderOfFiftyThousandEntriesInOrder) {
  constexpr int kCount = 50'000;
  std::vector<ondisk::Item> items;
  std::vector<std::string> names;
  for (int number = 0; number < kCount; ++number) {
    std::array<char, 32> name;
    std::snprintf(name.data(), name.size(), "IMG_%06d.jpg", number);
    names.emplace_back(name.data());
  }
  for (int number = 0; number < kCount; ++number) {
    const auto shuffled = static_cast<std::size_t>(number) * 7919 % kCount;
    items.push_back(file(names[shuffled], 3));
  }
  const TreeOnDisk tree({folder("a", items), file("b")}, Medium::memory);
  RecordedWalk record = walk(tree.location());
  ASSERT_EQ(record.paths.size(), names.size() + 2);
  EXPECT_EQ(record.totalSize, 3u * kCount);
  for (std::size_t number = 0; number < names.size(); ++number) {
    ASSERT_EQ(record.paths[number + 1], "a/" + names[number]);
  }
}

// --- packages

TEST(DirectoryEnumeration, KnowsPackagesByNameAndByMark) {
  const TreeOnDisk tree({
      folder("A.app", {file("x", 5), folder("Inner.BUNDLE", {file("y", 7)})}),
      folder("marked", {file("z")}).withAttribute("user.norvex.package", "1"),
      folder("unmarked").withAttribute("user.norvex.package", "0"),
      folder("overmarked").withAttribute("user.norvex.package", "1\n"),
      file("file.app"),
      file("file").withAttribute("user.norvex.package", "1"),
      folder("plain"),
  });
  const RecordedWalk record = walk(tree.location(), {.packages = true});
  std::vector<std::string> packages;
  for (std::size_t position = 0; position < record.paths.size(); ++position) {
    ASSERT_TRUE(record.locations[position].facts()->isPackage.has_value());
    if (*record.locations[position].facts()->isPackage) packages.push_back(record.paths[position]);
  }
  EXPECT_THAT(packages, ElementsAre("A.app", "A.app/Inner.BUNDLE", "marked"));
  EXPECT_THAT(record.paths,
              ElementsAre("A.app", "A.app/Inner.BUNDLE", "A.app/Inner.BUNDLE/y", "A.app/x", "file",
                          "file.app", "marked", "marked/z", "overmarked", "plain", "unmarked"));
}

TEST(DirectoryEnumeration, AsksForPackagesOnlyWhenTheyAreWanted) {
  const TreeOnDisk tree({folder("A.app")});
  EXPECT_FALSE(walk(tree.location()).locations[0].facts()->isPackage.has_value());
}

// --- facts

TEST(DirectoryEnumeration, LeavesInItsLocationsAllThatIsReadOfThem) {
  const TreeOnDisk tree({folder("A.app", {file("x", 5)}), link("l", "A.app"), folder("plain")});
  const RecordedWalk record = walk(tree.location(), {.packages = true});
  // Nobody can ask the file system about what is gone.
  tree.clear();
  LinuxResourceValues values;
  constexpr ResourceKey kKeys[] = {ResourceKey::TotalFileSize, ResourceKey::IsDirectory,
                                   ResourceKey::IsPackage};
  std::vector<ResourceValueTable> tables;
  for (const Location& location : record.locations) tables.push_back(values.values(location, kKeys).value());
  using enum ResourceKey;
  EXPECT_THAT(tables, ElementsAre(ResourceValueTable{{IsDirectory, 1}, {IsPackage, 1}},
                                  ResourceValueTable{{IsDirectory, 0}, {IsPackage, 0}, {TotalFileSize, 5}},
                                  ResourceValueTable{{IsDirectory, 0}, {IsPackage, 0}, {TotalFileSize, 5}},
                                  ResourceValueTable{{IsDirectory, 1}, {IsPackage, 0}}));
}

TEST(DirectoryEnumeration, AddsUpToWhatFindAddsUp) {
  std::vector<ondisk::Item> items;
  for (std::uint64_t number = 0; number < 40; ++number) {
    const std::string name = std::to_string(number);
    items.push_back(
        folder(name, {file("a", number * 1001), folder(".b", {file("c", number), link("l", name)})}));
  }
  const TreeOnDisk tree(items);
  const std::string command = "find '" + tree.path() + "' ! -type d -printf '%s\\n'";
  std::FILE* output = ::popen(command.c_str(), "r");
  ASSERT_NE(output, nullptr);
  std::uint64_t sum = 0;
  for (unsigned long long size = 0; std::fscanf(output, "%llu", &size) == 1;) sum += size;
  ASSERT_EQ(::pclose(output), 0);
  ASSERT_GT(sum, 0u);
  EXPECT_EQ(walk(tree.location()).totalSize, sum);
}

}  // namespace
}  // namespace norvex
