#include "platform/linux/StatvfsVolumeCatalog.h"

#include <gtest/gtest.h>
#include <sched.h>
#include <sys/mount.h>

#include <cerrno>
#include <cstdio>

#include "tests/linux/walk/ChildProcess.h"
#include "tests/support/TreeOnDisk.h"

namespace norvex {
namespace {

using ondisk::file;
using ondisk::folder;
using ondisk::TreeOnDisk;

TEST(StatvfsVolumeCatalog, DoesNotResolveWhatIsNotThere) {
  const TreeOnDisk tree;
  StatvfsVolumeCatalog catalog;
  FileReference reference{"before"};
  EXPECT_EQ(catalog.makeReference(tree.path("missing"), reference), ENOENT);
  EXPECT_EQ(reference.path, "before");
}

TEST(StatvfsVolumeCatalog, SaturatesAtWhatACountHolds) {
  EXPECT_EQ(usedInodes(100, 40), 60u);
  EXPECT_EQ(usedInodes(0x1'0000'0000, 0), 0xFFFF'FFFFu);
  EXPECT_EQ(usedInodes(0x5'0000'0000, 0x4'0000'0001), 0xFFFF'FFFFu);
  EXPECT_EQ(usedInodes(40, 100), 0u);
}

// Mounts `type` on a folder and counts what is there after `items` were made in it.
void countOn(const char* type, const TreeOnDisk& tree, const std::vector<ondisk::Item>& items,
             std::int16_t status, VolumeObjectCounts expected) {
  inChildProcess([&] {
    ASSERT_TRUE(enterOwnMounts());
    ASSERT_EQ(::mount("none", tree.path("volume").c_str(), type, 0, nullptr), 0);
    tree.add("volume", items);
    StatvfsVolumeCatalog catalog;
    FileReference inside;
    VolumeReference volume;
    VolumeObjectCounts counts{7, 7};
    ASSERT_EQ(catalog.makeReference(tree.path("volume/a"), inside), 0);
    ASSERT_EQ(catalog.volumeOf(inside, volume), 0);
    EXPECT_EQ(catalog.objectCounts(volume, counts), status);
    EXPECT_EQ(counts.files, expected.files);
    EXPECT_EQ(counts.folders, expected.folders);
  });
}

TEST(StatvfsVolumeCatalog, CountsTheUsedInodesAsFiles) {
  if (!canMount("tmpfs")) GTEST_SKIP() << "tmpfs cannot be mounted here, not even in a view of one's own";
  const TreeOnDisk tree({folder("volume")});
  // Two folders, two files and the root.
  countOn("tmpfs", tree, {folder("a", {folder("b", {file("c"), file("d")})})}, 0, {5, 0});
}

TEST(StatvfsVolumeCatalog, HasNoCountsOfAVolumeWithoutInodes) {
  if (!canMount("ramfs")) GTEST_SKIP() << "ramfs cannot be mounted here, not even in a view of one's own";
  const TreeOnDisk tree({folder("volume")});
  countOn("ramfs", tree, {folder("a")}, ENOTSUP, {7, 7});
}

}  // namespace
}  // namespace norvex
