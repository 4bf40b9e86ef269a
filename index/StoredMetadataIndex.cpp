#include "index/StoredMetadataIndex.h"

#include <algorithm>
#include <limits>

#include "index/StoredQuery.h"

namespace norvex {
namespace {

std::uint32_t saturated(std::uint64_t count) {
  return static_cast<std::uint32_t>(
      std::min<std::uint64_t>(count, std::numeric_limits<std::uint32_t>::max()));
}

}  // namespace

std::unique_ptr<MetadataQuery> StoredMetadataIndex::createQuery() {
  return makeStoredQuery(stores_, loops_);
}

std::unique_ptr<MetadataResult> StoredMetadataIndex::itemAtPath(const std::string& path) {
  const std::string item = normalizedPath(path);
  const std::string root = stores_.volumeRootOf(item);
  const auto store = stores_.storeOf(root);
  if (!store.ok()) return nullptr;
  std::string_view below = std::string_view(item).substr(root.size());
  if (!below.empty() && below.front() == '/') below.remove_prefix(1);
  const auto found = store.value()->itemAt(below);
  if (!found.ok() || !found.value()) return nullptr;
  return std::make_unique<StoredResult>(*store.value(), *found.value());
}

std::int32_t StoredVolumeCatalog::makeReference(const std::string& path, FileReference& file) {
  FileReference resolved;
  const std::int32_t status = unindexed_.makeReference(path, resolved);
  if (status == 0) file.path = path;
  return status;
}

std::int16_t StoredVolumeCatalog::volumeOf(const FileReference& file, VolumeReference& volume) {
  volume.root = stores_.volumeRootOf(normalizedPath(file.path));
  return 0;
}

std::int16_t StoredVolumeCatalog::objectCounts(const VolumeReference& volume, VolumeObjectCounts& counts) {
  if (const auto store = stores_.storeOf(volume.root); store.ok()) {
    if (const auto stored = store.value()->counts()) {
      counts = {.files = saturated(stored->files), .folders = saturated(stored->folders)};
      return 0;
    }
  }
  FileReference file;
  VolumeReference unindexedVolume;
  constexpr std::int16_t kUnresolved = -1;
  if (unindexed_.makeReference(volume.root, file) != 0) return kUnresolved;
  if (const std::int16_t status = unindexed_.volumeOf(file, unindexedVolume); status != 0) return status;
  return unindexed_.objectCounts(unindexedVolume, counts);
}

}  // namespace norvex
