#include "platform/linux/LinuxResourceValues.h"

#include <fcntl.h>

#include <cerrno>

#include "platform/FileDescriptor.h"
#include "platform/PackageNames.h"
#include "platform/linux/CallablePath.h"
#include "platform/linux/ItemAttributes.h"
#include "platform/linux/PackageMark.h"
#include "platform/linux/VolumeStatistics.h"

namespace norvex {
namespace {

using Value = std::optional<ResourceValue>;

// What the facts that a walk left in a location say about `key`. Nothing when they do not cover it.
std::optional<Result<Value>> valueFromFacts(const ItemFacts& facts, ResourceKey key) {
  if (key == ResourceKey::VolumeTotalCapacity || key == ResourceKey::VolumeAvailableCapacity) return {};
  // What cannot be told to be a package is none.
  if (facts.error != 0) {
    return key == ResourceKey::IsPackage ? Result<Value>(Value(0)) : systemError(facts.error);
  }
  switch (key) {
    case ResourceKey::TotalFileSize:
      return Result<Value>(facts.isDirectory ? Value() : Value(facts.totalFileSize));
    case ResourceKey::IsDirectory:
      return Result<Value>(Value(facts.isDirectory ? 1 : 0));
    case ResourceKey::IsPackage:
      if (!facts.isDirectory) return Result<Value>(Value(0));
      if (!facts.isPackage) return {};
      return Result<Value>(Value(*facts.isPackage ? 1 : 0));
    default:
      return {};
  }
}

}  // namespace

// The values of one location, with one system call for all that it answers.
class LinuxResourceValues::Request {
 public:
  Request(LinuxResourceValues& owner, const Location& location)
      : owner_(owner), path_(withoutTrailingSeparators(location.path())), location_(location) {}

  Result<Value> value(ResourceKey key) {
    switch (key) {
      case ResourceKey::VolumeTotalCapacity:
      case ResourceKey::VolumeAvailableCapacity:
        return capacity(key);
      case ResourceKey::IsPackage:
        return Value(attributes().error == 0 && isPackage() ? 1 : 0);
      default:
        break;
    }
    if (attributes().error != 0) return systemError(attributes().error);
    if (key == ResourceKey::IsDirectory) return Value(attributes().isFolder ? 1 : 0);
    if (attributes().isFolder) return Value();
    return Value(key == ResourceKey::TotalFileSize ? totalSize() : attributes().size);
  }

 private:
  const ItemAttributes& attributes() {
    if (!attributes_) {
      attributes_.emplace();
      attributes_->error = path_.error();
      if (attributes_->error == 0) attributes_ = attributesOf(path_.folder(), path_.path());
    }
    return *attributes_;
  }

  std::uint64_t totalSize() {
    if (!attributes().isRegularFile) return attributes().size;
    const std::lock_guard lock(owner_.streamsLock_);
    return owner_.streams_.totalSize(attributes(), path_.folder(), path_.path());
  }

  bool isPackage() {
    if (!attributes().isFolder) return false;
    if (isPackageName(withoutTrailingSeparators(location_.path()))) return true;
    constexpr int kFlags = O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC;
    const FileDescriptor folder(::openat(path_.folder(), path_.path(), kFlags));
    return folder && isMarkedAsPackage(folder.number());
  }

  Result<Value> capacity(ResourceKey key) {
    if (!volume_) volume_ = volumeStatistics(location_.path());
    if (!volume_->ok()) return volume_->error();
    const struct statvfs& volume = volume_->value();
    // All free blocks, those kept for the system included: what is left of the total is what df calls used.
    const std::uint64_t blocks = key == ResourceKey::VolumeTotalCapacity ? volume.f_blocks : volume.f_bfree;
    return Value(blocks * volume.f_frsize);
  }

  LinuxResourceValues& owner_;
  const CallablePath path_;
  const Location& location_;
  std::optional<ItemAttributes> attributes_;
  std::optional<Result<struct statvfs>> volume_;
};

Result<std::optional<ResourceValue>> LinuxResourceValues::value(const Location& location, ResourceKey key) {
  if (location.facts()) {
    if (auto known = valueFromFacts(*location.facts(), key)) return *std::move(known);
  }
  return Request(*this, location).value(key);
}

Result<ResourceValueTable> LinuxResourceValues::values(const Location& location,
                                                       std::span<const ResourceKey> keys) {
  ResourceValueTable table;
  Request request(*this, location);
  for (const ResourceKey key : keys) {
    std::optional<Result<Value>> value;
    if (location.facts()) value = valueFromFacts(*location.facts(), key);
    if (!value) value = request.value(key);
    if (!value->ok()) return value->error();
    if (value->value()) table[key] = *value->value();
  }
  return table;
}

}  // namespace norvex
