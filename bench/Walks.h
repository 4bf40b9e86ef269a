// The two operations that walk a folder, as the scan does them, on the roles of Linux.
#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <span>

#include "platform/linux/LinuxDirectoryEnumeration.h"
#include "platform/linux/LinuxResourceValues.h"

namespace norvex::bench {

struct Roles {
  LinuxDirectoryEnumeration enumeration;
  LinuxResourceValues values;
};

inline std::uint64_t sizeForFile(Roles& roles, const Location& file) {
  const auto size = roles.values.value(file, ResourceKey::TotalFileSize);
  return size ? size.value().value_or(0) : 0;
}

inline std::uint64_t sizeForDirectory(Roles& roles, const Location& directory) {
  constexpr ResourceKey kPrefetch[] = {ResourceKey::TotalFileSize, ResourceKey::IsDirectory};
  const auto walk =
      roles.enumeration.enumerator(directory, kPrefetch, [](const Location&, const Error&) { return true; });
  std::uint64_t sum = 0;
  while (const Location* item = walk->next()) sum += sizeForFile(roles, *item);
  return sum;
}

using FolderHandler = std::function<void(const Location&, std::uint64_t depth)>;
using FileHandler =
    std::function<void(const Location&, std::uint64_t depth, std::optional<std::uint64_t> size)>;

inline void scanDirectoryInDetail(Roles& roles, const Location& directory,
                                  const FolderHandler& packageHandler, const FolderHandler& directoryHandler,
                                  const FileHandler& fileHandler) {
  constexpr ResourceKey kPrefetch[] = {ResourceKey::FileSize, ResourceKey::IsDirectory,
                                       ResourceKey::IsPackage};
  const auto walk =
      roles.enumeration.enumerator(directory, kPrefetch, [](const Location&, const Error&) { return true; });
  while (const Location* item = walk->next()) {
    const auto isPackage = roles.values.value(*item, ResourceKey::IsPackage);
    const auto isDirectory = roles.values.value(*item, ResourceKey::IsDirectory);
    if (!isDirectory) continue;
    const std::uint64_t depth = walk->level();
    if (isPackage && isPackage.value().value_or(0) != 0) {
      if (packageHandler) packageHandler(*item, depth);
    } else if (isDirectory.value().value_or(0) != 0) {
      if (directoryHandler) directoryHandler(*item, depth);
    } else {
      const auto size = roles.values.value(*item, ResourceKey::TotalFileSize);
      if (size && fileHandler) fileHandler(*item, depth, size.value());
    }
  }
}

}  // namespace norvex::bench
