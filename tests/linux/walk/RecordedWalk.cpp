#include "tests/linux/walk/RecordedWalk.h"

#include <algorithm>

#include "platform/linux/LinuxDirectoryEnumeration.h"

namespace norvex {
namespace {

std::string below(const Location& root, const Location& item) {
  if (item.path() == root.path()) return ".";
  return item.path().substr(root.path().size() + (root.path().back() == '/' ? 0 : 1));
}

}  // namespace

std::size_t RecordedWalk::count(const std::string& path) const {
  return static_cast<std::size_t>(std::count(paths.begin(), paths.end(), path));
}

RecordedWalk walk(const Location& root, const WalkOptions& options) {
  constexpr ResourceKey kSizing[] = {ResourceKey::TotalFileSize, ResourceKey::IsDirectory};
  constexpr ResourceKey kDetail[] = {ResourceKey::FileSize, ResourceKey::IsDirectory, ResourceKey::IsPackage};
  using Keys = std::span<const ResourceKey>;
  RecordedWalk record;
  LinuxDirectoryEnumeration enumeration;
  const auto onError = [&](const Location& folder, const Error& error) {
    record.errors.push_back(below(root, folder) + ": " + std::to_string(error.code));
    return !options.onError || options.onError(below(root, folder));
  };
  const auto walking =
      enumeration.enumerator(root, options.packages ? Keys(kDetail) : Keys(kSizing), onError);
  while (const Location* item = walking->next()) {
    record.paths.push_back(below(root, *item));
    record.levels.push_back(walking->level());
    record.locations.push_back(*item);
    if (!item->facts()->isDirectory) record.totalSize += item->facts()->totalFileSize;
    if (options.afterItem) options.afterItem(record.paths.back());
  }
  return record;
}

}  // namespace norvex
