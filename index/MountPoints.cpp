#include "index/MountPoints.h"

#include <fcntl.h>
#include <sys/stat.h>

namespace norvex {
namespace {

constexpr int kFlags = AT_SYMLINK_NOFOLLOW | AT_NO_AUTOMOUNT | AT_STATX_DONT_SYNC;

bool sameDevice(const struct statx& a, const struct statx& b) {
  return a.stx_dev_major == b.stx_dev_major && a.stx_dev_minor == b.stx_dev_minor;
}

}  // namespace

bool isMountPoint(const std::string& path) {
  if (path == "/") return true;
  struct statx status {};
  if (::statx(AT_FDCWD, path.c_str(), kFlags, STATX_TYPE, &status) != 0) return false;
  if ((status.stx_attributes_mask & STATX_ATTR_MOUNT_ROOT) != 0) {
    return (status.stx_attributes & STATX_ATTR_MOUNT_ROOT) != 0;
  }
  // A kernel that does not say: another device than the folder around it. Misses only bind mounts.
  struct statx around {};
  const std::string parent = path.substr(0, path.rfind('/') + 1);
  return ::statx(AT_FDCWD, parent.c_str(), kFlags & ~AT_SYMLINK_NOFOLLOW, STATX_TYPE, &around) == 0 &&
         !sameDevice(status, around);
}

}  // namespace norvex
