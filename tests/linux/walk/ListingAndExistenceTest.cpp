#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "platform/linux/LinuxDirectoryListing.h"
#include "platform/linux/LinuxFileExistence.h"
#include "tests/linux/walk/ChildProcess.h"
#include "tests/support/TreeOnDisk.h"

namespace norvex {
namespace {

using ondisk::file;
using ondisk::folder;
using ondisk::link;
using ondisk::TreeOnDisk;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Optional;

TEST(LinuxDirectoryListing, NamesOneLevelInByteOrder) {
  const TreeOnDisk tree(
      {file("b"), file(".hidden"), folder("B", {file("deep")}), file("\xFF"), file("a\nb"), link("l", "x")});
  EXPECT_THAT(LinuxDirectoryListing().names(tree.path()),
              Optional(ElementsAre(".hidden", "B", "a\nb", "b", "l", "\xFF")));
}

TEST(LinuxDirectoryListing, NamesNothingInAnEmptyFolder) {
  const TreeOnDisk tree;
  EXPECT_THAT(LinuxDirectoryListing().names(tree.path()), Optional(IsEmpty()));
}

TEST(LinuxDirectoryListing, FollowsALinkToAFolder) {
  const TreeOnDisk tree({folder("a", {file("x")}), link("l", "a")});
  EXPECT_THAT(LinuxDirectoryListing().names(tree.path("l")), Optional(ElementsAre("x")));
}

TEST(LinuxDirectoryListing, HasNoNamesWhereNoneCanBeRead) {
  const TreeOnDisk tree(
      {file("file"), folder("closed", {file("x")}).withMode(0), link("dangling", "missing")});
  asOrdinaryUser([&] {
    for (const char* name : {"missing", "file", "closed", "dangling"}) {
      EXPECT_EQ(LinuxDirectoryListing().names(tree.path(name)), std::nullopt) << name;
    }
    EXPECT_EQ(LinuxDirectoryListing().names(""), std::nullopt);
  });
}

TEST(LinuxFileExistence, FindsWhatIsThereAndFollowsLinks) {
  const TreeOnDisk tree({file("file"), folder("folder"), link("toFile", "file"), link("dangling", "missing"),
                         link("loop", "loop"), folder("closed", {file("x")}).withMode(0)});
  struct Case {
    const char* name;
    bool exists;
  };
  asOrdinaryUser([&] {
    for (const Case& given :
         {Case{"file", true}, Case{"folder", true}, Case{"folder/", true}, Case{"toFile", true},
          Case{"closed", true}, Case{"missing", false}, Case{"dangling", false}, Case{"loop", false},
          Case{"file/below", false}, Case{"closed/x", false}}) {
      EXPECT_EQ(LinuxFileExistence().exists(tree.path(given.name)), given.exists) << given.name;
    }
    EXPECT_FALSE(LinuxFileExistence().exists(""));
  });
}

}  // namespace
}  // namespace norvex
