#include "platform/linux/NamedStreams.h"

#include <fcntl.h>
#include <linux/limits.h>
#include <sys/vfs.h>
#include <sys/xattr.h>

#include <algorithm>
#include <array>
#include <cstring>
#include <fstream>
#include <sstream>
#include <string>

#include "platform/FileDescriptor.h"

namespace norvex {
namespace {

constexpr std::array<std::string_view, 3> kTypes = {"ntfs", "ntfs3", "fuseblk"};

// What the kernel headers name only in part.
constexpr std::uint64_t kMagicOfNtfs = 0x5346544e;
constexpr std::uint64_t kMagicOfNtfs3 = 0x7366746e;
constexpr std::uint64_t kMagicOfFuse = 0x65735546;

FileDescriptor handleOf(int folder, const char* path) {
  return FileDescriptor(::openat(folder, path, O_PATH | O_NOFOLLOW | O_CLOEXEC));
}

// The way to the extended attributes of what a handle stands for.
std::string pathOf(const FileDescriptor& handle) {
  return "/proc/self/fd/" + std::to_string(handle.number());
}

// The type under which the device's file system is mounted; empty when it is not in the table of mounts. A
// line there reads "id parent major:minor root point options [tags] - type source options".
std::string mountedType(std::uint64_t device) {
  const std::string number = std::to_string(device >> 32U) + ':' + std::to_string(device & 0xFFFFFFFFU);
  std::ifstream mounts("/proc/self/mountinfo");
  for (std::string line; std::getline(mounts, line);) {
    std::istringstream fields(line);
    std::string id;
    std::string parent;
    std::string deviceNumber;
    fields >> id >> parent >> deviceNumber;
    const std::size_t separator = line.find(" - ");
    if (deviceNumber != number || separator == std::string::npos) continue;
    const std::size_t start = separator + 3;
    return line.substr(start, line.find(' ', start) - start);
  }
  return {};
}

bool hasNamedStreams(std::uint64_t device, int folder, const char* path) {
  const FileDescriptor handle = handleOf(folder, path);
  struct statfs answer;
  if (!handle || ::fstatfs(handle.number(), &answer) != 0) return false;
  const auto magic = static_cast<std::uint64_t>(answer.f_type);
  if (magic == kMagicOfNtfs || magic == kMagicOfNtfs3) return true;
  return magic == kMagicOfFuse && NamedStreams::isKeptBy(mountedType(device));
}

}  // namespace

bool NamedStreams::isKeptBy(std::string_view fileSystemType) {
  return std::find(kTypes.begin(), kTypes.end(), fileSystemType) != kTypes.end();
}

std::uint64_t NamedStreams::sizeOfStreams(int folder, const char* path) {
  const FileDescriptor handle = handleOf(folder, path);
  if (!handle) return 0;
  const std::string item = pathOf(handle);
  std::string names(XATTR_LIST_MAX, '\0');
  const ssize_t length = ::listxattr(item.c_str(), names.data(), names.size());
  if (length <= 0) return 0;
  names.resize(static_cast<std::size_t>(length));
  std::uint64_t bytes = 0;
  for (const char* name = names.c_str(); name < names.c_str() + names.size(); name += std::strlen(name) + 1) {
    if (!std::string_view(name).starts_with("user.")) continue;
    const ssize_t size = ::getxattr(item.c_str(), name, nullptr, 0);
    if (size > 0) bytes += static_cast<std::uint64_t>(size);
  }
  return bytes;
}

void NamedStreams::moveTo(std::uint64_t device, int folder, const char* path) {
  auto known = std::find_if(seen_.begin(), seen_.end(),
                            [device](const Device& entry) { return entry.device == device; });
  if (known == seen_.end()) {
    known = seen_.insert(known, {device, hasNamedStreams(device, folder, path)});
  }
  device_ = device;
  hasStreams_ = known->hasStreams;
}

}  // namespace norvex
