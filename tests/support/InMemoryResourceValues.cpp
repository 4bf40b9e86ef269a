#include "tests/support/InMemoryResourceValues.h"

#include <cerrno>

namespace norvex {
namespace {

using Answer = Result<std::optional<ResourceValue>>;

// What is known about an item, from a walk's facts or from the tree, in one form.
struct Known {
  int error;
  bool isDirectory;
  bool isPackage;
  std::optional<std::uint64_t> totalSize;
};

Known knownFrom(const Location& location, const TreeItem* item) {
  Known known{ENOENT, false, false, std::nullopt};
  if (item != nullptr) {
    known.error = item->attributeError;
    known.isDirectory = item->isDirectory();
    known.isPackage = item->kind == TreeItem::Kind::package;
    if (item->hasTotalSize) known.totalSize = item->size;
  }
  if (location.facts()) {
    known.error = location.facts()->error;
    known.isDirectory = location.facts()->isDirectory;
    if (location.facts()->isPackage) known.isPackage = *location.facts()->isPackage;
  }
  if (known.isDirectory) known.totalSize.reset();
  return known;
}

}  // namespace

std::string nameOf(ResourceKey key) {
  switch (key) {
    case ResourceKey::FileSize:
      return "FileSize";
    case ResourceKey::TotalFileSize:
      return "TotalFileSize";
    case ResourceKey::IsDirectory:
      return "IsDirectory";
    case ResourceKey::IsPackage:
      return "IsPackage";
    case ResourceKey::VolumeTotalCapacity:
      return "VolumeTotalCapacity";
    case ResourceKey::VolumeAvailableCapacity:
      return "VolumeAvailableCapacity";
  }
  return "?";
}

Result<std::optional<ResourceValue>> InMemoryResourceValues::value(const Location& location,
                                                                   ResourceKey key) {
  calls_.add("value " + nameOf(key) + " " + location.path());
  return answer(location, key);
}

Answer InMemoryResourceValues::answer(const Location& location, ResourceKey key) {
  const TreeItem* item = tree_.find(location.path());
  if (item != nullptr && item->keyErrors.contains(key)) return systemError(item->keyErrors.at(key));
  const Known known = knownFrom(location, item);
  // Whether something is a package is never a failure of the item's attributes.
  if (key == ResourceKey::IsPackage)
    return std::optional<ResourceValue>(known.error == 0 && known.isPackage ? 1 : 0);
  if (known.error != 0) return systemError(known.error);
  if (key == ResourceKey::IsDirectory) return std::optional<ResourceValue>(known.isDirectory ? 1 : 0);
  if (key == ResourceKey::TotalFileSize || key == ResourceKey::FileSize) {
    const auto next = nextSizes.find(location.path());
    if (next == nextSizes.end() || next->second.empty()) return known.totalSize;
    const ResourceValue size = next->second.front();
    next->second.erase(next->second.begin());
    return std::optional<ResourceValue>(size);
  }
  const auto volume = capacities.find(location.path());
  if (volume == capacities.end() || !volume->second.contains(key)) return std::optional<ResourceValue>();
  return std::optional<ResourceValue>(volume->second.at(key));
}

Result<ResourceValueTable> InMemoryResourceValues::values(const Location& location,
                                                          std::span<const ResourceKey> keys) {
  std::string call = "values";
  for (const ResourceKey key : keys) call += " " + nameOf(key);
  calls_.add(call + " " + location.path());

  const auto volume = capacities.find(location.path());
  ResourceValueTable table;
  for (const ResourceKey key : keys) {
    if (volume != capacities.end()) {
      if (volume->second.contains(key)) table[key] = volume->second.at(key);
      continue;
    }
    const Answer one = answer(location, key);
    if (!one) return one.error();
    if (one.value()) table[key] = *one.value();
  }
  return table;
}

}  // namespace norvex
