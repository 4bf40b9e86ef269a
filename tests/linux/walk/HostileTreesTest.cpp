// Folders that may not be read, items that vanish or change while a walk is on its way, trees that bite their
// tail.
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sched.h>
#include <sys/mount.h>
#include <unistd.h>

#include "platform/linux/LinuxResourceValues.h"
#include "tests/linux/walk/ChildProcess.h"
#include "tests/linux/walk/RecordedWalk.h"
#include "tests/support/TreeOnDisk.h"

namespace norvex {
namespace {

using ondisk::file;
using ondisk::folder;
using ondisk::link;
using ondisk::TreeOnDisk;
using testing::ElementsAre;
using testing::IsEmpty;

std::string told(const std::string& path, int error) {
  return path + ": " + std::to_string(error);
}

// --- permissions

TEST(WalkOfHostileTree, TellsOfAFolderThatCannotBeOpenedAndGoesOn) {
  const TreeOnDisk tree({file("a", 1), folder("closed", {file("x", 10)}).withMode(0), file("z", 100)});
  for (const bool packages : {false, true}) {
    asOrdinaryUser([&] {
      const RecordedWalk record = walk(tree.location(), {.packages = packages});
      EXPECT_THAT(record.paths, ElementsAre("a", "closed", "z"));
      EXPECT_THAT(record.errors, ElementsAre(told("closed", EACCES)));
      EXPECT_EQ(record.totalSize, 101u);
    });
  }
}

TEST(WalkOfHostileTree, TellsOfARootThatCannotBeOpened) {
  const TreeOnDisk tree({folder("closed", {file("x", 10)}).withMode(0)});
  asOrdinaryUser([&] {
    const RecordedWalk record = walk(Location::folder(tree.path("closed")));
    EXPECT_THAT(record.paths, IsEmpty());
    EXPECT_THAT(record.errors, ElementsAre(told(".", EACCES)));
  });
}

TEST(WalkOfHostileTree, EndsWhenTheErrorHandlerSaysSo) {
  const TreeOnDisk tree({file("a"), folder("closed").withMode(0), file("z")});
  asOrdinaryUser([&] {
    const RecordedWalk record = walk(tree.location(), {.onError = [](const std::string&) { return false; }});
    EXPECT_THAT(record.paths, ElementsAre("a", "closed"));
    EXPECT_THAT(record.errors, ElementsAre(told("closed", EACCES)));
  });
}

TEST(WalkOfHostileTree, YieldsOnceWhatCanBeListedButNotSearched) {
  const TreeOnDisk tree({folder("listed", {file("x", 10), folder("y", {file("below")})}).withMode(0744)});
  asOrdinaryUser([&] {
    const RecordedWalk record = walk(tree.location());
    EXPECT_THAT(record.paths, ElementsAre("listed", "listed/x", "listed/y"));
    EXPECT_THAT(record.errors, IsEmpty());
    EXPECT_EQ(record.locations[1].facts()->error, EACCES);
    EXPECT_EQ(record.locations[2].facts()->error, EACCES);
  });
}

TEST(WalkOfHostileTree, SaysOnceAnItemThatItsValuesCannotBeRead) {
  const TreeOnDisk tree({folder("listed", {file("x", 10)}).withMode(0744)});
  asOrdinaryUser([&] {
    const RecordedWalk record = walk(tree.location(), {.packages = true});
    LinuxResourceValues values;
    EXPECT_EQ(values.value(record.locations[1], ResourceKey::TotalFileSize).error().code, EACCES);
    EXPECT_EQ(values.value(record.locations[1], ResourceKey::IsDirectory).error().code, EACCES);
    EXPECT_EQ(values.value(record.locations[1], ResourceKey::IsPackage).value(), 0u);
  });
}

TEST(WalkOfHostileTree, TakesAFolderForNoPackageWhenItsMarkCannotBeRead) {
  const TreeOnDisk tree({folder("closed").withAttribute("user.norvex.package", "1").withMode(0),
                         folder("closed.app").withMode(0)});
  asOrdinaryUser([&] {
    const RecordedWalk record = walk(tree.location(), {.packages = true});
    ASSERT_THAT(record.paths, ElementsAre("closed", "closed.app"));
    EXPECT_FALSE(*record.locations[0].facts()->isPackage);
    EXPECT_TRUE(*record.locations[1].facts()->isPackage);
  });
}

// --- what changes during the walk

TEST(WalkOfHostileTree, LeavesOutAnItemThatVanishesBeforeItsFolderIsRead) {
  const TreeOnDisk tree({folder("a", {file("gone", 1), file("stays", 2)})});
  const RecordedWalk record = walk(tree.location(), {.afterItem = [&](const std::string& path) {
                                     if (path == "a") tree.remove("a/gone");
                                   }});
  EXPECT_THAT(record.paths, ElementsAre("a", "a/stays"));
  EXPECT_THAT(record.errors, IsEmpty());
}

TEST(WalkOfHostileTree, PassesOverAFolderThatVanishesBeforeItIsEntered) {
  const TreeOnDisk tree({folder("a", {file("x")}), folder("b", {folder("c", {file("y")})}), file("d")});
  const RecordedWalk record = walk(tree.location(), {.afterItem = [&](const std::string& path) {
                                     if (path == "a") tree.remove("b");
                                   }});
  EXPECT_THAT(record.paths, ElementsAre("a", "a/x", "b", "d"));
  EXPECT_THAT(record.errors, IsEmpty());
}

TEST(WalkOfHostileTree, GoesOnWhenTheFolderThatItIsInVanishes) {
  const TreeOnDisk tree(
      {folder("a", {folder("b", {file("x")}), folder("c", {file("y")}), file("z")}), file("d")});
  const RecordedWalk record = walk(tree.location(), {.afterItem = [&](const std::string& path) {
                                     if (path == "a/b/x") tree.remove("a");
                                   }});
  EXPECT_THAT(record.paths, ElementsAre("a", "a/b", "a/b/x", "a/c", "a/z", "d"));
  EXPECT_THAT(record.errors, IsEmpty());
}

TEST(WalkOfHostileTree, IsNotLedAwayByALinkThatTakesAFoldersPlace) {
  const TreeOnDisk outside({file("secret", 1000)});
  const TreeOnDisk tree({folder("a"), folder("b", {file("x")}), file("c")});
  const RecordedWalk record = walk(tree.location(), {.afterItem = [&](const std::string& path) {
                                     if (path != "a") return;
                                     tree.remove("b");
                                     tree.add(".", {link("b", outside.path())});
                                   }});
  EXPECT_THAT(record.paths, ElementsAre("a", "b", "c"));
  EXPECT_THAT(record.errors, IsEmpty());
  EXPECT_EQ(record.totalSize, 0u);
}

TEST(WalkOfHostileTree, IsNotLedAwayByAFileThatTakesAFoldersPlace) {
  const TreeOnDisk tree({folder("a"), folder("b", {file("x")})});
  const RecordedWalk record = walk(tree.location(), {.afterItem = [&](const std::string& path) {
                                     if (path != "a") return;
                                     tree.remove("b");
                                     tree.add(".", {file("b", 7)});
                                   }});
  EXPECT_THAT(record.paths, ElementsAre("a", "b"));
  EXPECT_THAT(record.errors, IsEmpty());
}

// --- folders that contain themselves

TEST(WalkOfHostileTree, DoesNotEnterAFolderThatIsItsOwnAncestor) {
  if (!canMount("tmpfs")) GTEST_SKIP() << "nothing can be mounted here, not even in a view of one's own";
  const TreeOnDisk tree(
      {folder("a", {folder("b", {folder("c")}), file("x", 1)}), folder("d", {file("y", 2)})});
  inChildProcess([&] {
    ASSERT_TRUE(enterOwnMounts());
    ASSERT_EQ(::mount(tree.path("a").c_str(), tree.path("a/b/c").c_str(), nullptr, MS_BIND, nullptr), 0);
    for (const bool packages : {false, true}) {
      const RecordedWalk record = walk(tree.location(), {.packages = packages});
      EXPECT_THAT(record.paths, ElementsAre("a", "a/b", "a/b/c", "a/x", "d", "d/y"));
      EXPECT_THAT(record.errors, ElementsAre(told("a/b/c", ELOOP)));
    }
  });
}

TEST(WalkOfHostileTree, EntersOtherMountedVolumes) {
  if (!canMount("tmpfs")) GTEST_SKIP() << "nothing can be mounted here, not even in a view of one's own";
  const TreeOnDisk tree({folder("here", {folder("mounted")})});
  inChildProcess([&] {
    ASSERT_TRUE(enterOwnMounts());
    ASSERT_EQ(::mount("none", tree.path("here/mounted").c_str(), "tmpfs", 0, nullptr), 0);
    tree.add("here/mounted", {file("x", 5)});
    const RecordedWalk record = walk(tree.location());
    EXPECT_THAT(record.paths, ElementsAre("here", "here/mounted", "here/mounted/x"));
    EXPECT_EQ(record.totalSize, 5u);
  });
}

}  // namespace
}  // namespace norvex
