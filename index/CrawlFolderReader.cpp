#include "index/CrawlFolderReader.h"

#include <dirent.h>
#include <fcntl.h>
#include <linux/btrfs.h>
#include <sched.h>
#include <sys/ioctl.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <sys/xattr.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>
#include <limits>

#include "index/FolderRules.h"
#include "index/SparseAttributes.h"
#include "platform/PackageNames.h"

namespace norvex {
namespace {

constexpr std::size_t kEntriesBytes = std::size_t{64} << 10U;
constexpr std::size_t kUsualAttributes = 256;
constexpr std::size_t kLongestAttribute = std::size_t{64}
                                          << 10U;  // the kernel's limit of a list of names and of a value
constexpr unsigned kWanted = STATX_TYPE | STATX_MODE | STATX_INO | STATX_SIZE | STATX_MTIME | STATX_MNT_ID;

// What a rule gives to an item.
struct Mark {
  std::string_view name;
  std::string_view value;
};
constexpr Mark kExcluded{"com_brixo_backup_excludeItem", "com.brixo.backupd"};
constexpr Mark kHasReceipt{"kMDItemDovecartHasReceipt", "1"};

constexpr std::uint64_t kSubvolumeRootInode = 256;

bool isDotOrDotDot(const char* name) {
  return name[0] == '.' && (name[1] == '\0' || (name[1] == '.' && name[2] == '\0'));
}

bool hasVanished(int code) {
  return code == ENOENT || code == ENOTDIR || code == ELOOP;
}

std::int64_t nanoseconds(const struct statx_timestamp& time) {
  constexpr std::int64_t kPerSecond = 1'000'000'000;
  std::int64_t sum = 0;
  if (__builtin_mul_overflow(time.tv_sec, kPerSecond, &sum) ||
      __builtin_add_overflow(sum, std::int64_t{time.tv_nsec}, &sum)) {
    constexpr std::numeric_limits<std::int64_t> kLimits;
    return time.tv_sec < 0 ? kLimits.min() : kLimits.max();
  }
  return sum;
}

std::int64_t bounded(std::uint64_t size) {
  constexpr auto kMost = static_cast<std::uint64_t>(std::numeric_limits<std::int64_t>::max());
  return static_cast<std::int64_t>(std::min(size, kMost));
}

// One that was taken of another subvolume and cannot change: what is in it is counted where it was taken of.
bool isReadOnlySnapshot(int fd) {
  struct stat status {};
  if (::fstat(fd, &status) != 0 || status.st_ino != kSubvolumeRootInode) return false;
  btrfs_ioctl_get_subvol_info_args subvolume{};
  if (::ioctl(fd, BTRFS_IOC_GET_SUBVOL_INFO, &subvolume) != 0) return false;
  const bool isSnapshot = std::any_of(std::begin(subvolume.parent_uuid), std::end(subvolume.parent_uuid),
                                      [](unsigned byte) { return byte != 0; });
  return isSnapshot && (subvolume.flags & BTRFS_SUBVOL_RDONLY) != 0;
}

void addMark(CrawlBatch& batch, std::uint32_t item, const Mark& mark) {
  batch.attributes.push_back({item, std::string(mark.name), std::string(mark.value)});
}

}  // namespace

bool CrawlNames::contains(std::string_view name) const {
  const auto found = std::lower_bound(
      starts.begin(), starts.end(), name,
      [this](std::uint32_t start, auto wanted) { return std::string_view(bytes.data() + start) < wanted; });
  return found != starts.end() && name == bytes.data() + *found;
}

// A current folder of its own makes attributes readable by name: there is no such call relative to a
// descriptor before Linux 6.13. The process's current folder stays as it is.
CrawlFolderReader::CrawlFolderReader(const CrawlVolume& volume, const CrawlRules& rules)
    : volume_(volume),
      rules_(rules),
      hasOwnCurrentFolder_(::unshare(CLONE_FS) == 0),
      entries_(kEntriesBytes),
      attributeNames_(kLongestAttribute),
      attributeValue_(kLongestAttribute) {}

Result<CrawlFolder> CrawlFolderReader::enter(const std::string& path, const CrawlPlace& place,
                                             const KeptFolder& around) {
  auto fd = volume_.openFolder(path, around);
  if (!fd) return fd.error();
  if (volume_.mayHaveSnapshots() && !path.empty() && isReadOnlySnapshot(fd.value().number()))
    return systemError(EXDEV);
  return CrawlFolder{path, volume_.absolute(path), place, std::move(fd).value()};
}

CrawlNames& CrawlFolderReader::scratchNames() {
  scratchNames_.bytes.clear();
  scratchNames_.starts.clear();
  return scratchNames_;
}

Result<bool> CrawlFolderReader::list(CrawlFolder& folder, CrawlNames& names, std::size_t mostBytes) {
  const auto sortNames = [&names] {
    std::sort(names.starts.begin(), names.starts.end(), [bytes = names.bytes.data()](auto left, auto right) {
      return std::strcmp(bytes + left, bytes + right) < 0;
    });
  };
  while (names.bytes.size() < mostBytes) {
    const long count = ::syscall(SYS_getdents64, folder.fd.number(), entries_.data(), entries_.size());
    if (count <= 0) {
      const int code = errno;
      sortNames();
      if (count == 0 || code == ENOENT) return true;  // ENOENT: removed while it was open
      return systemError(code);
    }
    for (long offset = 0; offset < count;) {
      const auto* entry = reinterpret_cast<const dirent64*>(entries_.data() + offset);
      offset += entry->d_reclen;
      if (isDotOrDotDot(entry->d_name)) continue;
      names.starts.push_back(static_cast<std::uint32_t>(names.bytes.size()));
      names.bytes.append(entry->d_name).push_back('\0');
    }
  }
  sortNames();
  return false;
}

void CrawlFolderReader::makeCurrent(const CrawlFolder& folder) {
  isCurrent_ = hasOwnCurrentFolder_ && ::fchdir(folder.fd.number()) == 0;
}

const char* CrawlFolderReader::attributePath(const CrawlFolder& folder, const char* name) {
  if (isCurrent_) return name;
  attributePath_ = "/proc/self/fd/" + std::to_string(folder.fd.number()) + "/" + name;
  return attributePath_.c_str();
}

void CrawlFolderReader::readItems(const CrawlFolder& folder, const CrawlNames& names, std::size_t first,
                                  std::size_t end, CrawlBatch& batch) {
  makeCurrent(folder);
  // Made in one piece each: the writer gives back what a worker has allocated, and each time one waits for
  // the other.
  batch.items.reserve(end - first);
  std::size_t nameBytes = 0;
  for (std::size_t index = first; index < end; ++index) nameBytes += std::strlen(names.at(index));
  batch.names.reserve(nameBytes);
  for (std::size_t index = first; index < end; ++index) {
    const char* name = names.at(index);
    readItem(folder, name, name, batch);
  }
}

void CrawlFolderReader::readItem(const CrawlFolder& folder, std::string_view name, const char* text,
                                 CrawlBatch& batch) {
  struct statx status {};
  // Relative to the current folder the kernel has no descriptor to look up and to hold.
  const int from = isCurrent_ ? AT_FDCWD : folder.fd.number();
  if (::statx(from, text, volume_.statFlags(), kWanted, &status) != 0) {
    if (!hasVanished(errno)) batch.problems.add(folder.absolute + "/" + text, errno);
    return;
  }
  const bool isFolder = S_ISDIR(status.stx_mode);
  const bool isFile = S_ISREG(status.stx_mode);
  if (isFolder && volume_.isLeftOut(status)) return;

  CrawledItem item;
  const auto number = static_cast<std::uint32_t>(batch.items.size());
  const bool isHeld = volume_.holds(status);
  OwnAttributes own;
  if ((isFile || isFolder) && isHeld) own = readAttributes(folder, text, isFolder, number, batch);
  if (isFolder) {
    item.kind = isHeld ? CrawlItemKind::folder : CrawlItemKind::border;
    item.type = rules_.types().ofFolder(name, own.isMarkedPackage);
    if (rules_.folderHasReceipt(folder.absolute + "/" + text)) addMark(batch, number, kHasReceipt);
  } else if (isFile) {
    const bool isExecutable = (status.stx_mode & (S_IXUSR | S_IXGRP | S_IXOTH)) != 0;
    item.type = rules_.types().ofFile(name);
    item.position = rules_.sizePosition(item.type, isExecutable, folder.place);
    if (rules_.fileHasReceipt(folder.absolute, name)) addMark(batch, number, kHasReceipt);
  } else {
    item.kind = CrawlItemKind::otherNoFolder;
    item.type = S_ISLNK(status.stx_mode) ? rules_.types().symbolicLink() : rules_.types().other();
  }
  item.nameStart = static_cast<std::uint32_t>(batch.names.size());
  item.nameLength = static_cast<std::uint16_t>(name.size());
  item.size = bounded(status.stx_size);
  item.mtime = nanoseconds(status.stx_mtime);
  batch.names.append(name);
  batch.items.push_back(item);
}

// To ask whether there are any is cheaper than to have them listed, and mostly the answer is no. Where it was
// yes - on some systems every file has one - the next ones are listed at once.
ssize_t CrawlFolderReader::listAttributes(const char* path) {
  if (!expectsAttributes_) {
    const ssize_t size = ::llistxattr(path, nullptr, 0);
    if (size <= 0) return size;
  }
  // The kernel allocates what it is told that there is room for, so the usual case asks for little.
  ssize_t size = ::llistxattr(path, attributeNames_.data(), kUsualAttributes);
  if (size < 0 && errno == ERANGE) size = ::llistxattr(path, attributeNames_.data(), attributeNames_.size());
  expectsAttributes_ = size > 0;
  return size;
}

CrawlFolderReader::OwnAttributes CrawlFolderReader::readAttributes(const CrawlFolder& folder,
                                                                   const char* name, bool isFolder,
                                                                   std::uint32_t item, CrawlBatch& batch) {
  OwnAttributes own;
  if (!volume_.hasAttributes()) return own;
  const char* path = attributePath(folder, name);
  const ssize_t size = listAttributes(path);
  if (size < 0 && errno == ENOTSUP) volume_.noteNoAttributes();
  for (ssize_t offset = 0; offset < size;) {
    const char* attribute = attributeNames_.data() + offset;
    const std::string_view text(attribute);
    offset += static_cast<ssize_t>(text.size()) + 1;
    if (const auto carried = sparseAttributeName(text)) {
      const std::string_view value = readValue(folder, name, attribute, batch);
      if (value.data() != nullptr)
        batch.attributes.push_back({item, std::string(*carried), std::string(value)});
    } else if (isFolder && text == kPackageMarkAttribute) {
      own.isMarkedPackage = withoutTerminator(readValue(folder, name, attribute, batch)) == kPackageMarkValue;
    } else if (isFolder && text == kRobotsBackupAttribute &&
               refusesBackup(readValue(folder, name, attribute, batch))) {
      addMark(batch, item, kExcluded);
    }
  }
  return own;
}

// Without an address when it cannot be read.
std::string_view CrawlFolderReader::readValue(const CrawlFolder& folder, const char* name,
                                              const char* attribute, CrawlBatch& batch) {
  const ssize_t size =
      ::lgetxattr(attributePath(folder, name), attribute, attributeValue_.data(), attributeValue_.size());
  if (size >= 0) return {attributeValue_.data(), static_cast<std::size_t>(size)};
  if (errno != ENODATA && !hasVanished(errno)) batch.problems.add(folder.absolute + "/" + name, errno);
  return {};
}

void CrawlFolderReader::readFolderItself(const CrawlFolder& folder, const CrawlNames& names, TypeId type,
                                         CrawlBatch& batch) {
  if (names.contains(kCacheTagName) && carriesCacheTag(folder)) {
    addMark(batch, CrawledAttribute::kFolderItself, kExcluded);
  }
  if (rules_.isPackage(type) && volume_.holdsFile(folder.fd.number(), kReceiptPathInPackage)) {
    addMark(batch, CrawledAttribute::kFolderItself, kHasReceipt);
  }
}

bool CrawlFolderReader::carriesCacheTag(const CrawlFolder& folder) const {
  CacheTag tag;
  tag.isInVolumeRoot = folder.path.empty();
  struct stat status {};
  if (::fstatat(folder.fd.number(), kCacheTagName.data(), &status, AT_SYMLINK_NOFOLLOW) != 0) return false;
  if (!S_ISREG(status.st_mode)) return false;
  // Should a device or a pipe take its place now, opening it must neither wait nor do anything.
  const FileDescriptor file(::openat(folder.fd.number(), kCacheTagName.data(),
                                     O_RDONLY | O_NOFOLLOW | O_NONBLOCK | O_NOCTTY | O_CLOEXEC));
  tag.isRegularFile = file && ::fstat(file.number(), &status) == 0 && S_ISREG(status.st_mode);
  if (!tag.isRegularFile) return false;
  std::array<char, kCacheTagSignatureSize> start{};
  const ssize_t size = ::pread(file.number(), start.data(), start.size(), 0);
  tag.firstBytes = {start.data(), static_cast<std::size_t>(std::max<ssize_t>(size, 0))};
  return isValidCacheTag(tag);
}

CrawledItem CrawlFolderReader::readRoot(CrawlFolder& root, CrawlBatch& batch) {
  makeCurrent(root);
  CrawledItem item;
  item.kind = CrawlItemKind::folder;
  struct statx status {};
  if (::statx(root.fd.number(), "", AT_EMPTY_PATH, kWanted, &status) == 0)
    item.mtime = nanoseconds(status.stx_mtime);
  const OwnAttributes own = readAttributes(root, ".", true, CrawledAttribute::kFolderItself, batch);
  item.type =
      rules_.types().ofFolder(root.absolute.substr(root.absolute.rfind('/') + 1), own.isMarkedPackage);
  return item;
}

}  // namespace norvex
