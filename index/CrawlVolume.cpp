#include "index/CrawlVolume.h"

#include <fcntl.h>
#include <linux/magic.h>
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

constexpr std::size_t kLongestPart = PATH_MAX - 1;
constexpr int kMostKeptFolders = 200;  // far below the number of files that a process may have open
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

bool isRemote(std::uint32_t fileSystemType) {
  return std::find(kRemoteFileSystems.begin(), kRemoteFileSystems.end(), fileSystemType) !=
         kRemoteFileSystems.end();
}

std::uint64_t deviceOf(const struct statx& status) {
  return (std::uint64_t{status.stx_dev_major} << 32) | status.stx_dev_minor;
}

int openat2Below(int folder, const char* path, int flags) {
  open_how how{};
  how.flags = static_cast<std::uint64_t>(static_cast<unsigned>(flags | O_CLOEXEC | O_NOFOLLOW));
  how.resolve = RESOLVE_NO_SYMLINKS | RESOLVE_NO_XDEV;
  return static_cast<int>(::syscall(SYS_openat2, folder, path, &how, sizeof how));
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
      mayHaveSnapshots_(other.mayHaveSnapshots_),
      hasOpenat2_(other.hasOpenat2_),
      hasAttributes_(other.hasAttributes()) {}

Result<CrawlVolume> CrawlVolume::open(const std::string& root, const std::string& leftOutFolder) {
  CrawlVolume volume;
  volume.root_ = root;
  volume.fd_ = FileDescriptor(::open(root.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
  if (!volume.fd_) return systemError(errno);
  struct statx status {};
  if (::statx(volume.fd_.number(), "", AT_EMPTY_PATH, kWanted, &status) != 0) return systemError(errno);
  volume.mount_ = status.stx_mnt_id;
  volume.device_ = deviceOf(status);
  struct statfs info {};
  if (::fstatfs(volume.fd_.number(), &info) != 0) return systemError(errno);
  const auto type = static_cast<std::uint32_t>(info.f_type);
  volume.statFlags_ =
      AT_SYMLINK_NOFOLLOW | AT_NO_AUTOMOUNT | (isRemote(type) ? AT_STATX_SYNC_AS_STAT : AT_STATX_DONT_SYNC);
  volume.mayHaveSnapshots_ = type == BTRFS_SUPER_MAGIC;
  // Old kernels have no openat2(), and some sandboxes refuse it.
  volume.hasOpenat2_ = static_cast<bool>(FileDescriptor(openat2Below(volume.fd_.number(), ".", O_PATH)));
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

// Opens `path` below `folder`, in as many steps as its length or the kernel asks for.
Result<FileDescriptor> CrawlVolume::openBelow(int folder, std::string_view path, int flags) const {
  const std::size_t longest = hasOpenat2_ ? kLongestPart : 0;
  FileDescriptor passed;
  while (path.size() > longest && path.find('/') != std::string_view::npos) {
    const std::size_t end = std::min(path.rfind('/', longest), path.find('/', longest));
    auto part =
        openPart(passed ? passed.number() : folder, std::string(path.substr(0, end)), O_PATH | O_DIRECTORY);
    if (!part) return part;
    passed = std::move(part).value();
    path.remove_prefix(end + 1);
  }
  return openPart(passed ? passed.number() : folder, std::string(path), flags);
}

Result<FileDescriptor> CrawlVolume::openPart(int folder, const std::string& path, int flags) const {
  FileDescriptor fd(hasOpenat2_ ? openat2Below(folder, path.c_str(), flags)
                                : ::openat(folder, path.c_str(), flags | O_CLOEXEC | O_NOFOLLOW));
  if (!fd) return systemError(errno);
  if (hasOpenat2_) return fd;
  struct statx status {};
  if (::statx(fd.number(), "", AT_EMPTY_PATH | statFlags_, kWanted, &status) != 0) return systemError(errno);
  if (!holds(status)) return systemError(EXDEV);
  return fd;
}

Result<FileDescriptor> CrawlVolume::openFolder(const std::string& path, const KeptFolder& around) const {
  std::string_view place = path.empty() ? std::string_view(".") : std::string_view(path);
  if (around != nullptr) place.remove_prefix(place.rfind('/') + 1);
  const int from = around != nullptr ? around->number() : fd_.number();
  // The folder's access time stays as it was where that is allowed: to its owner.
  auto fd = openBelow(from, place, O_RDONLY | O_DIRECTORY | O_NOATIME);
  if (fd || fd.error().code != EPERM) return fd;
  return openBelow(from, place, O_RDONLY | O_DIRECTORY);
}

KeptFolder CrawlVolume::keep(FileDescriptor folder) const {
  if (keptFolders_.fetch_add(1) >= kMostKeptFolders) {
    keptFolders_.fetch_sub(1);
    return nullptr;
  }
  const auto giveUp = [this](const FileDescriptor* kept) {
    const std::unique_ptr<const FileDescriptor> owner(kept);
    keptFolders_.fetch_sub(1);
  };
  return KeptFolder(std::make_unique<const FileDescriptor>(std::move(folder)).release(), giveUp);
}

bool CrawlVolume::holdsFile(int folder, std::string_view path) const {
  const auto file = openBelow(folder, path, O_PATH);
  struct stat status {};
  return file && ::fstat(file.value().number(), &status) == 0 && S_ISREG(status.st_mode);
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
