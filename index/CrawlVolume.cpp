#include "index/CrawlVolume.h"

#include <fcntl.h>
#include <linux/openat2.h>
#include <sys/stat.h>
#include <sys/statfs.h>
#include <sys/syscall.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <climits>
#include <cstdio>
#include <cstring>
#include <utility>

namespace norvex {
namespace {

constexpr unsigned kWanted = STATX_TYPE | STATX_INO | STATX_MNT_ID;

// File systems whose attributes are elsewhere and may have changed there: these are asked anew.
constexpr std::array<std::uint32_t, 7> kRemoteFileSystems{
    0x6969,      // NFS
    0xFF534D42,  // CIFS
    0xFE534D42,  // SMB2
    0x65735546,  // FUSE
    0x00C36400,  // Ceph
    0x01021997,  // 9P
    0x5346414F,  // AFS
};

bool isRemote(int fd) {
  struct statfs info {};
  if (::fstatfs(fd, &info) != 0) return true;
  const auto type = static_cast<std::uint32_t>(info.f_type);
  return std::find(kRemoteFileSystems.begin(), kRemoteFileSystems.end(), type) != kRemoteFileSystems.end();
}

std::uint64_t deviceOf(const struct statx& status) {
  return (std::uint64_t{status.stx_dev_major} << 32) | status.stx_dev_minor;
}

// One step below `folder`, of at most PATH_MAX bytes.
int openBelow(int folder, const char* path, int flags) {
  open_how how{};
  how.flags = static_cast<std::uint64_t>(static_cast<unsigned>(flags | O_DIRECTORY | O_CLOEXEC | O_NOFOLLOW));
  how.resolve = RESOLVE_NO_SYMLINKS | RESOLVE_NO_XDEV;
  return static_cast<int>(::syscall(SYS_openat2, folder, path, &how, sizeof how));
}

// The folder's own access time stays as it was where that is allowed: to its owner.
int openToRead(int folder, const char* path) {
  const int fd = openBelow(folder, path, O_RDONLY | O_NOATIME);
  if (fd >= 0 || errno != EPERM) return fd;
  return openBelow(folder, path, O_RDONLY);
}

}  // namespace

Result<std::string> fileSystemIdAt(const std::string& path) {
  struct statfs info {};
  if (::statfs(path.c_str(), &info) != 0) return systemError(errno);
  std::array<int, 2> id{};
  static_assert(sizeof info.f_fsid == sizeof id);
  std::memcpy(id.data(), &info.f_fsid, sizeof id);
  std::array<char, 64> text{};
  std::snprintf(text.data(), text.size(), "%lx:%08x%08x", static_cast<unsigned long>(info.f_type),
                static_cast<unsigned>(id[0]), static_cast<unsigned>(id[1]));
  return std::string(text.data());
}

CrawlVolume::CrawlVolume(CrawlVolume&& other) noexcept
    : root_(std::move(other.root_)),
      fd_(std::move(other.fd_)),
      mount_(other.mount_),
      device_(other.device_),
      leftOutDevice_(other.leftOutDevice_),
      leftOutInode_(other.leftOutInode_),
      statFlags_(other.statFlags_),
      hasAttributes_(other.hasAttributes()) {}

Result<CrawlVolume> CrawlVolume::open(const std::string& root, const std::string& leftOutFolder) {
  CrawlVolume volume;
  volume.root_ = root;
  volume.fd_ = ScopedFd(::open(root.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
  if (!volume.fd_) return systemError(errno);
  struct statx status {};
  if (::statx(volume.fd_.get(), "", AT_EMPTY_PATH, kWanted, &status) != 0) return systemError(errno);
  volume.mount_ = status.stx_mnt_id;
  volume.device_ = deviceOf(status);
  volume.statFlags_ = AT_SYMLINK_NOFOLLOW | AT_NO_AUTOMOUNT |
                      (isRemote(volume.fd_.get()) ? AT_STATX_SYNC_AS_STAT : AT_STATX_DONT_SYNC);
  if (::statx(AT_FDCWD, leftOutFolder.c_str(), 0, kWanted, &status) == 0) {
    volume.leftOutDevice_ = deviceOf(status);
    volume.leftOutInode_ = status.stx_ino;
  }
  return volume;
}

std::string CrawlVolume::absolute(std::string_view path) const {
  std::string whole = root_;
  if (path.empty()) return whole;
  if (!whole.ends_with('/')) whole += '/';
  return whole.append(path);
}

Result<ScopedFd> CrawlVolume::openFolder(const std::string& path) const {
  ScopedFd passed;
  int from = fd_.get();
  std::size_t start = 0;
  while (path.size() - start >= PATH_MAX) {
    const std::size_t end = path.rfind('/', start + PATH_MAX - 1);
    passed = ScopedFd(openBelow(from, path.substr(start, end - start).c_str(), O_PATH));
    if (!passed) return systemError(errno);
    from = passed.get();
    start = end + 1;
  }
  const char* rest = path.c_str() + start;
  ScopedFd fd(openToRead(from, *rest == '\0' ? "." : rest));
  if (!fd) return systemError(errno);
  return fd;
}

bool CrawlVolume::holds(const struct statx& status) const {
  if ((status.stx_attributes & STATX_ATTR_AUTOMOUNT) != 0) return false;
  // A file system may have several devices (subvolumes), and one device several mounts: only the mount tells.
  // Kernels before 5.8 do not know it.
  if ((status.stx_mask & STATX_MNT_ID) == 0) return deviceOf(status) == device_;
  return status.stx_mnt_id == mount_;
}

bool CrawlVolume::isLeftOut(const struct statx& status) const {
  return status.stx_ino == leftOutInode_ && deviceOf(status) == leftOutDevice_ && leftOutInode_ != 0;
}

}  // namespace norvex
