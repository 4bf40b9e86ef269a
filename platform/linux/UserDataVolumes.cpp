#include "platform/linux/UserDataVolumes.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <algorithm>
#include <map>
#include <string_view>

#include "platform/linux/MountTable.h"

namespace norvex {
namespace {

// Kinds of file systems on disks of the machine itself, in which people keep files. Whatever is not here is
// left out:
//  - proc, sysfs, devtmpfs, tmpfs, ramfs, cgroup2 and the like are made by the kernel and gone at the end;
//  - nfs, cifs, 9p, ceph, fuse.sshfs and the like are somebody else's disks;
//  - squashfs, erofs, iso9660, udf, cramfs are images that come as they are;
//  - fuse.* (bindfs, mergerfs, encrypted folders, ...) and ecryptfs show again what lies in another one;
//  - autofs is a place where something may be mounted.
constexpr std::string_view kUserDataTypes[] = {
    "bcachefs", "btrfs",
    "exfat",  // memory cards and sticks
    "ext2",     "ext3",    "ext4",
    "f2fs",     // flash memory
    "fuseblk",  // a file system on a local disk by way of FUSE: ntfs-3g, exfat-fuse
    "hfs",      "hfsplus", "jfs",
    "msdos",  // as vfat, with short names only
    "nilfs2",   "ntfs",    "ntfs3", "reiserfs", "ufs",
    "vfat",  // sticks and cameras; not where it is the EFI system partition
    "xfs",      "zfs",
};

constexpr std::string_view kOverlay = "overlay";
constexpr std::string_view kEfiType = "vfat";
constexpr std::string_view kEfiMountPoints[] = {"/boot", "/boot/efi", "/efi"};

template <typename Table>
bool contains(const Table& table, std::string_view entry) {
  return std::find(std::begin(table), std::end(table), entry) != std::end(table);
}

bool isReadOnlyLoop(const Mount& mount) {
  return mount.readOnly && mount.source.starts_with("/dev/loop");
}

bool holdsUserData(const Mount& mount) {
  const std::string_view type = mount.type;
  if (type == kOverlay) return mount.target == "/";
  if (type == kEfiType && contains(kEfiMountPoints, mount.target)) return false;
  // "fuseblk.ntfs": the kind behind the point is the program's word.
  return contains(kUserDataTypes, type.substr(0, type.find('.'))) && !isReadOnlyLoop(mount);
}

bool isBetter(const std::string& mountPoint, const std::string& other) {
  if (mountPoint.size() != other.size()) return mountPoint.size() < other.size();
  return mountPoint < other;
}

}  // namespace

bool isReachableFolder(const std::string& path) {
  // Without asking a file system's server anew: one that hangs must not hang us.
  struct statx status {};
  const int flags = AT_NO_AUTOMOUNT | AT_STATX_DONT_SYNC;
  return ::statx(AT_FDCWD, path.c_str(), flags, STATX_TYPE, &status) == 0 && S_ISDIR(status.stx_mode);
}

Result<std::vector<std::string>> userDataVolumes(const std::string& mountInfoPath,
                                                 const FolderTest& isFolder) {
  const Result<MountTable> table = MountTable::read(mountInfoPath);
  if (!table) return table.error();
  std::map<dev_t, std::string> mountPoints;
  for (const Mount& mount : table.value().mounts()) {
    if (!holdsUserData(mount) || !table.value().isVisible(mount) || !isFolder(mount.target)) continue;
    const auto [known, isNew] = mountPoints.try_emplace(mount.device, mount.target);
    if (!isNew && isBetter(mount.target, known->second)) known->second = mount.target;
  }
  std::vector<std::string> volumes;
  volumes.reserve(mountPoints.size());
  for (const auto& [device, mountPoint] : mountPoints) volumes.push_back(mountPoint);
  std::sort(volumes.begin(), volumes.end());
  return volumes;
}

}  // namespace norvex
