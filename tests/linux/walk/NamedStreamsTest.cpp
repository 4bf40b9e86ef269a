#include "platform/linux/NamedStreams.h"

#include <gtest/gtest.h>

#include "platform/linux/CallablePath.h"
#include "tests/linux/walk/RecordedWalk.h"
#include "tests/support/TreeOnDisk.h"

namespace norvex {
namespace {

using ondisk::file;
using ondisk::TreeOnDisk;

TEST(NamedStreams, AreKeptByTheDriversOfNtfs) {
  for (const char* type : {"ntfs", "ntfs3", "fuseblk"}) EXPECT_TRUE(NamedStreams::isKeptBy(type)) << type;
  for (const char* type : {"ext4", "btrfs", "xfs", "tmpfs", "fuse", "fuse.sshfs", "vfat", ""}) {
    EXPECT_FALSE(NamedStreams::isKeptBy(type)) << type;
  }
}

TEST(NamedStreams, AreTheAttributesThatTheDriverLists) {
  const TreeOnDisk tree(
      {file("with", 5).withAttribute("user.Zone.Identifier", "0123456789"), file("without", 5)});
  EXPECT_EQ(NamedStreams::sizeOfStreams(CallablePath(".").folder(), tree.path("with").c_str()), 10u);
  EXPECT_EQ(NamedStreams::sizeOfStreams(CallablePath(".").folder(), tree.path("without").c_str()), 0u);
  EXPECT_EQ(NamedStreams::sizeOfStreams(CallablePath(".").folder(), tree.path("missing").c_str()), 0u);
}

TEST(NamedStreams, AreNoneWhereAttributesAreNotes) {
  const TreeOnDisk tree({file("with", 5).withAttribute("user.comment", "0123456789")});
  EXPECT_EQ(walk(tree.location()).totalSize, 5u);
}

}  // namespace
}  // namespace norvex
