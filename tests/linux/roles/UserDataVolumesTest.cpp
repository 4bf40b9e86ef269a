#include "platform/linux/UserDataVolumes.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <cerrno>

#include "ScratchFolder.h"

namespace norvex {
namespace {

using testing::ElementsAre;

bool everyFolder(const std::string&) {
  return true;
}

std::vector<std::string> volumesOf(const std::string& table, const FolderTest& isFolder = everyFolder) {
  const ScratchFolder folder;
  const auto volumes = userDataVolumes(folder.write("mountinfo", table), isFolder);
  if (!volumes) {
    ADD_FAILURE() << volumes.error().description;
    return {};
  }
  return volumes.value();
}

// The line of a mount on the root (which has the id 1) of a file system that no other line has.
std::string line(const std::string& target, const std::string& type, const std::string& source = "/dev/sdx",
                 const std::string& options = "rw") {
  static int id = 100;
  ++id;
  return std::to_string(id) + " 1 9:" + std::to_string(id) + " / " + target + " " + options +
         ",relatime shared:1 - " + type + " " + source + " " + options + "\n";
}

const std::string kRoot = "1 0 8:1 / / rw,relatime shared:1 - ext4 /dev/sda1 rw\n";

TEST(UserDataVolumes, ADesktopHasItsDisksAndSticks) {
  const std::string table = kRoot +
                            "2 1 0:5 / /proc rw - proc proc rw\n"
                            "3 1 0:6 / /sys rw - sysfs sysfs rw\n"
                            "4 1 0:7 / /dev rw - devtmpfs udev rw\n"
                            "5 4 0:8 / /dev/shm rw - tmpfs tmpfs rw\n"
                            "6 1 0:9 / /run rw - tmpfs tmpfs rw\n"
                            "7 1 8:2 / /boot/efi rw - vfat /dev/sda2 rw\n"
                            "8 1 8:3 / /home rw - xfs /dev/sda3 rw\n"
                            "9 1 8:17 / /media/ada/STICK rw - vfat /dev/sdb1 rw\n"
                            "10 1 7:0 / /snap/core/1 ro - squashfs /dev/loop0 ro\n"
                            "11 8 0:44 / /home/ada/cloud rw - fuse.sshfs ada@host:/ rw\n"
                            "12 1 0:45 / /srv/nas rw - nfs4 nas:/export rw\n"
                            "13 6 0:46 / /run/user/1000 rw - tmpfs tmpfs rw\n"
                            "14 6 0:47 / /run/user/1000/doc rw - fuse.portal portal rw\n";
  EXPECT_THAT(volumesOf(table), ElementsAre("/", "/home", "/media/ada/STICK"));
}

TEST(UserDataVolumes, TheKindOfTheFileSystemDecides) {
  const char* const included[] = {
      "ext2", "ext3", "ext4",  "btrfs",   "xfs",  "f2fs",  "jfs",   "reiserfs", "nilfs2",  "bcachefs",
      "zfs",  "ntfs", "ntfs3", "fuseblk", "vfat", "msdos", "exfat", "hfs",      "hfsplus", "fuseblk.ntfs"};
  const char* const leftOut[] = {
      "proc",        "sysfs",   "tmpfs", "ramfs",  "devtmpfs", "cgroup2",    "nfs",      "nfs4",
      "cifs",        "smb3",    "9p",    "ceph",   "fuse",     "fuse.sshfs", "autofs",   "squashfs",
      "erofs",       "iso9660", "udf",   "cramfs", "overlay",  "ecryptfs",   "virtiofs", "fuse.gvfsd-fuse",
      "binfmt_misc", "tracefs", "ext",   "ext44",  "none"};
  for (const char* type : included) {
    EXPECT_THAT(volumesOf(kRoot + line("/data", type)), ElementsAre("/", "/data")) << type;
  }
  for (const char* type : leftOut) {
    EXPECT_THAT(volumesOf(kRoot + line("/data", type)), ElementsAre("/")) << type;
  }
}

TEST(UserDataVolumes, AnOverlayCountsAsTheRootOnly) {
  EXPECT_THAT(volumesOf("1 0 0:30 / / rw - overlay overlay rw,upperdir=/u\n" + line("/merged", "overlay")),
              ElementsAre("/"));
}

TEST(UserDataVolumes, EfiSystemPartitionsAreLeftOutWhereTheyAreMountedAsSuch) {
  const std::string table = kRoot + line("/boot", "vfat") + line("/efi", "vfat") + line("/boot/efi", "vfat") +
                            line("/boot2", "vfat") + line("/mnt/efi", "vfat");
  EXPECT_THAT(volumesOf(table), ElementsAre("/", "/boot2", "/mnt/efi"));
  EXPECT_THAT(volumesOf(kRoot + line("/boot", "ext4")), ElementsAre("/", "/boot"));
}

TEST(UserDataVolumes, ReadOnlyLoopDevicesAreImages) {
  const std::string table = kRoot + line("/image", "ext4", "/dev/loop3", "ro") +
                            line("/container", "ext4", "/dev/loop4", "rw") +
                            line("/archive", "ext4", "/dev/sdz", "ro");
  EXPECT_THAT(volumesOf(table), ElementsAre("/", "/archive", "/container"));
  EXPECT_THAT(
      volumesOf(kRoot + "20 1 7:1 / /a ro - ext4 /dev/loop1 rw\n21 1 7:2 / /b rw - ext4 /dev/loop2 ro\n"),
      ElementsAre("/"))
      << "read-only as a mount, and as a file system";
}

TEST(UserDataVolumes, AFileSystemHasOneEntryItsShortestMountPoint) {
  const std::string table = kRoot +
                            "2 1 8:3 / /mnt/data rw - ext4 /dev/sda3 rw\n"
                            "3 1 8:3 /music /srv rw - ext4 /dev/sda3 rw\n"
                            "4 1 8:3 / /mnt/another rw - ext4 /dev/sda3 rw\n"
                            "5 1 8:1 /var /var rw - ext4 /dev/sda1 rw\n"
                            "6 1 8:4 / /bb rw - ext4 /dev/sda4 rw\n"
                            "7 1 8:4 / /aa rw - ext4 /dev/sda4 rw\n";
  EXPECT_THAT(volumesOf(table), ElementsAre("/", "/aa", "/srv"));
}

TEST(UserDataVolumes, MountPointsThatAreHiddenAreNotCounted) {
  // Over the same folder; over a folder above; below what was mounted over; at a place of its own again.
  const std::string table = kRoot +
                            "2 1 8:2 / /a rw - ext4 /dev/sda2 rw\n"
                            "3 2 8:3 / /a rw - xfs /dev/sda3 rw\n"
                            "4 1 8:4 / /b/c rw - ext4 /dev/sda4 rw\n"
                            "5 1 0:50 / /b rw - tmpfs tmpfs rw\n"
                            "6 5 8:6 / /b/d rw - ext4 /dev/sda6 rw\n"
                            "7 1 8:4 / /second/place rw - ext4 /dev/sda4 rw\n";
  EXPECT_THAT(volumesOf(table), ElementsAre("/", "/a", "/b/d", "/second/place"));
  EXPECT_THAT(volumesOf(kRoot + "2 1 8:2 / /a rw - ext4 /dev/sda2 rw\n3 2 0:9 / /a rw - tmpfs tmpfs rw\n"),
              ElementsAre("/"));
}

TEST(UserDataVolumes, ARootThatIsMountedOverCountsAsWhatLiesOnTop) {
  EXPECT_THAT(volumesOf("1 0 0:1 / / rw - rootfs rootfs rw\n2 1 8:1 / / rw - ext4 /dev/sda1 rw\n"
                        "3 2 8:2 / /home rw - ext4 /dev/sda2 rw\n4 1 8:3 / /home rw - ext4 /dev/sda3 rw\n"),
              ElementsAre("/", "/home"));
}

TEST(UserDataVolumes, WithoutTheRootsOwnLineTheOthersStillCount) {
  EXPECT_THAT(
      volumesOf("20 11 8:2 / /home rw - ext4 /dev/sda2 rw\n21 20 8:3 / /home/b rw - ext4 /dev/sda3 rw\n"),
      ElementsAre("/home", "/home/b"));
}

TEST(UserDataVolumes, AMountedFileIsNoVolume) {
  const auto allButFiles = [](const std::string& path) { return path != "/etc/hosts" && path != "/srv/f"; };
  const std::string table = kRoot +
                            "2 1 8:3 /hosts /etc/hosts rw - ext4 /dev/sda3 rw\n"
                            "3 1 8:4 /f /srv/f rw - ext4 /dev/sda4 rw\n"
                            "4 1 8:4 / /longer/than/that rw - ext4 /dev/sda4 rw\n";
  EXPECT_THAT(volumesOf(table, allButFiles), ElementsAre("/", "/longer/than/that"));
}

TEST(UserDataVolumes, EscapesInMountPointsAreDecoded) {
  EXPECT_THAT(volumesOf(kRoot + line("/media/my\\040disk\\011\\134x", "ext4") + line("/media/\\344", "ext4")),
              ElementsAre("/", "/media/my disk\t\\x", "/media/\xe4"));
}

TEST(UserDataVolumes, TheOrderIsThatOfTheBytes) {
  EXPECT_THAT(volumesOf(line("/b", "ext4") + line("/B", "ext4") + line("/a/b", "ext4") +
                        line("/a-b", "ext4") + kRoot + line("/\\303\\244", "ext4")),
              ElementsAre("/", "/B", "/a-b", "/a/b", "/b", "/ä"));
}

TEST(UserDataVolumes, LinesWithoutSenseArePassedOver) {
  EXPECT_THAT(volumesOf(kRoot + "nonsense\n5 1 8:9\n\n" + line("/data", "ext4")), ElementsAre("/", "/data"));
  EXPECT_THAT(volumesOf(""), ElementsAre());
}

TEST(UserDataVolumes, ATableInWhichMountsLieOnEachOtherEndsTheSearch) {
  volumesOf(
      "2 3 8:2 / /a rw - ext4 /dev/sda2 rw\n3 2 8:3 / /a rw - ext4 /dev/sda3 rw\n"
      "4 4 8:4 / /b rw - ext4 /dev/sda4 rw\n");
}

TEST(UserDataVolumes, ATableThatCannotBeReadIsAFailure) {
  const ScratchFolder folder;
  EXPECT_EQ(userDataVolumes(folder.at("missing")).error().code, ENOENT);
  EXPECT_EQ(userDataVolumes(folder.path()).error().code, EISDIR);
}

TEST(UserDataVolumes, TheMachinesOwnTableCanBeRead) {
  const auto volumes = userDataVolumes("/proc/self/mountinfo");
  ASSERT_TRUE(volumes);
  for (const std::string& volume : volumes.value()) EXPECT_TRUE(isReachableFolder(volume)) << volume;
}

TEST(UserDataVolumes, OnlyAFolderIsAReachableFolder) {
  const ScratchFolder folder;
  EXPECT_TRUE(isReachableFolder(folder.path()));
  EXPECT_FALSE(isReachableFolder(folder.write("file", "")));
  EXPECT_FALSE(isReachableFolder(folder.at("missing")));
}

}  // namespace
}  // namespace norvex
