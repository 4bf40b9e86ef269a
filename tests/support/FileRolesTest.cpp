#include <gmock/gmock.h>

#include <cerrno>

#include "tests/support/TestPlatform.h"

namespace norvex {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;

// The walk below `root` as lines "level path", and the folders that could not be read as "! path".
std::vector<std::string> walk(const std::string& root, bool goOn = true) {
  std::vector<std::string> lines;
  const ResourceKey prefetch[] = {ResourceKey::IsPackage};
  const auto enumerator = platform().directoryEnumeration.enumerator(
      Location::folder(root), prefetch, [&](const Location& location, const Error& error) {
        lines.push_back("! " + location.urlText() + " " + std::to_string(error.code));
        return goOn;
      });
  while (const Location* item = enumerator->next()) {
    lines.push_back(std::to_string(enumerator->level()) + " " + item->urlText());
  }
  return lines;
}

TEST(InMemoryDirectoryEnumeration, WalksDepthFirstInByteOrder) {
  TestPlatform world;
  world.files.put("/", folder("t", {file("b", 1), package("a.app", {file("z", 1)}), file("B", 1),
                                    file(".h", 1), link("l", "/t/a.app", 3)}));
  EXPECT_THAT(walk("/t"), ElementsAre("1 file:///t/.h", "1 file:///t/B", "1 file:///t/a.app/",
                                      "2 file:///t/a.app/z", "1 file:///t/b", "1 file:///t/l"));
}

TEST(InMemoryDirectoryEnumeration, TellsOfAFolderThatCannotBeReadAndGoesOn) {
  TestPlatform world;
  world.files.put("/", folder("t", {folder("a", {file("x", 1)}).unreadable(EACCES), file("b", 1)}));
  EXPECT_THAT(walk("/t"), ElementsAre("1 file:///t/a/", "! file:///t/a/ 13", "1 file:///t/b"));
}

TEST(InMemoryDirectoryEnumeration, EndsWhereTheErrorHandlerSaysSo) {
  TestPlatform world;
  world.files.put("/", folder("t", {folder("a").unreadable(EACCES), file("b", 1)}));
  EXPECT_THAT(walk("/t", false), ElementsAre("1 file:///t/a/", "! file:///t/a/ 13"));
}

TEST(InMemoryDirectoryEnumeration, TellsOfARootThatIsNoFolder) {
  TestPlatform world;
  world.files.put("/", link("l", "/t", 2));
  world.files.put("/", folder("t", {file("x", 1)}));
  EXPECT_THAT(walk("/l"), ElementsAre("! file:///l/ 20"));
  EXPECT_THAT(walk("/none"), ElementsAre("! file:///none/ 2"));
}

TEST(InMemoryDirectoryEnumeration, LeavesOutWhatHasVanished) {
  TestPlatform world;
  world.files.put("/", folder("t", {file("a", 1).vanishing(), file("b", 1)}));
  EXPECT_THAT(walk("/t"), ElementsAre("1 file:///t/b"));
}

TEST(InMemoryDirectoryEnumeration, CarriesTheFactsThatWereAskedFor) {
  TestPlatform world;
  world.files.put("/", folder("t", {package("a.app"), file("x", 7)}));
  const auto bare = world.directoryEnumeration.enumerator(Location::folder("/t"), {}, nullptr);
  EXPECT_FALSE(bare->next()->facts()->isPackage.has_value());
  const ResourceKey prefetch[] = {ResourceKey::IsPackage};
  const auto full = world.directoryEnumeration.enumerator(Location::folder("/t"), prefetch, nullptr);
  EXPECT_TRUE(*full->next()->facts()->isPackage);
  EXPECT_EQ(full->next()->facts()->totalFileSize, 7U);
}

TEST(InMemoryDirectoryListing, NamesOneLevelAndFollowsLinks) {
  TestPlatform world;
  world.files.put("/",
                  folder("t", {folder("b", {file("x", 1)}), file(".a", 1), folder("c").unreadable(EACCES)}));
  world.files.put("/", link("l", "/t", 2));
  EXPECT_THAT(*world.directoryListing.names("/t"), ElementsAre(".a", "b", "c"));
  EXPECT_THAT(*world.directoryListing.names("/l"), ElementsAre(".a", "b", "c"));
  for (const char* path : {"/t/c", "/t/.a", "/none"})
    EXPECT_FALSE(world.directoryListing.names(path)) << path;
}

TEST(InMemoryFileExistence, FollowsLinks) {
  TestPlatform world;
  world.files.put("/", folder("t", {file("x", 1), link("good", "/t/x", 4), link("bad", "/none", 5)}));
  world.files.put("/t", link("round", "/t/round", 8));
  for (const char* path : {"/", "/t", "/t/", "/t/x", "/t/good"})
    EXPECT_TRUE(world.fileExistence.exists(path)) << path;
  for (const char* path : {"/t/bad", "/t/round", "/t/x/y"})
    EXPECT_FALSE(world.fileExistence.exists(path)) << path;
}

std::string answer(const TestPlatform&, const std::string& path, ResourceKey key) {
  const auto result = platform().resourceValues.value(Location::file(path), key);
  if (!result) return "error " + std::to_string(result.error().code);
  return result.value() ? std::to_string(*result.value()) : "absent";
}

TEST(InMemoryResourceValues, AnswersForEveryKindOfItem) {
  TestPlatform world;
  world.files.put("/", folder("t", {file("f", 5), folder("d"), package("p.app"), link("l", "/t/d", 4),
                                    file("n", 5).withoutTotalSize(), file("e", 5).withoutAttributes(EIO),
                                    file("k", 5).failing(ResourceKey::IsPackage, EPERM)}));
  const struct {
    const char* path;
    const char* isDirectory;
    const char* isPackage;
    const char* totalFileSize;
  } rows[] = {
      {"/t/f", "0", "0", "5"},       {"/t/d", "1", "0", "absent"},        {"/t/p.app", "1", "1", "absent"},
      {"/t/l", "0", "0", "4"},       {"/t/n", "0", "0", "absent"},        {"/t/e", "error 5", "0", "error 5"},
      {"/t/k", "0", "error 1", "5"}, {"/t/-", "error 2", "0", "error 2"},
  };
  for (const auto& row : rows) {
    EXPECT_EQ(answer(world, row.path, ResourceKey::IsDirectory), row.isDirectory) << row.path;
    EXPECT_EQ(answer(world, row.path, ResourceKey::IsPackage), row.isPackage) << row.path;
    EXPECT_EQ(answer(world, row.path, ResourceKey::TotalFileSize), row.totalFileSize) << row.path;
  }
}

TEST(InMemoryResourceValues, GivesCapacitiesOfTheVolumesNamed) {
  TestPlatform world;
  world.resourceValues.capacities["/v"] = {{ResourceKey::VolumeTotalCapacity, 9}};
  const ResourceKey keys[] = {ResourceKey::VolumeAvailableCapacity, ResourceKey::VolumeTotalCapacity};
  EXPECT_THAT(world.resourceValues.values(Location::folder("/v"), keys).value(),
              ElementsAre(std::pair(ResourceKey::VolumeTotalCapacity, 9U)));
  EXPECT_EQ(world.resourceValues.values(Location::folder("/w"), keys).error().code, ENOENT);
  EXPECT_THAT(world.calls.of({"values"}),
              ElementsAre("values VolumeAvailableCapacity VolumeTotalCapacity /v",
                          "values VolumeAvailableCapacity VolumeTotalCapacity /w"));
}

TEST(InMemoryResourceValues, ChangesSizesOnTheWay) {
  TestPlatform world;
  world.files.put("/", file("f", 5));
  world.resourceValues.nextSizes["/f"] = {0, 3};
  for (const char* size : {"0", "3", "5"}) EXPECT_EQ(answer(world, "/f", ResourceKey::TotalFileSize), size);
}

TEST(InMemoryFileTree, ReplacesAnItemOfTheSameName) {
  InMemoryFileTree tree;
  tree.put("/a/b", file("x", 1));
  tree.put("/a/b", file("x", 2));
  EXPECT_EQ(tree.find("/a/b/x")->size, 2U);
  EXPECT_EQ(tree.find("/a/b")->children.size(), 1U);
  EXPECT_THAT(tree.find("/")->name, IsEmpty());
}

}  // namespace
}  // namespace norvex
