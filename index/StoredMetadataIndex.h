// The metadata index and the volume catalog, as the stores of the volumes answer for them.
#pragma once

#include "index/VolumeStores.h"
#include "platform/EventLoop.h"
#include "platform/MetadataIndex.h"
#include "platform/VolumeCatalog.h"

namespace norvex {

class StoredMetadataIndex final : public MetadataIndex {
 public:
  // Both outlive this object, its queries and its results.
  StoredMetadataIndex(VolumeStores& stores, EventLoops& loops) : stores_(stores), loops_(loops) {}

  std::unique_ptr<MetadataQuery> createQuery() override;

  // A path is answered for by the store of its own volume alone, a mount point by the store of what is
  // mounted there. nullptr where there is no such store, or none that can be read.
  std::unique_ptr<MetadataResult> itemAtPath(const std::string& path) override;

 private:
  VolumeStores& stores_;
  EventLoops& loops_;
};

class StoredVolumeCatalog final : public VolumeCatalog {
 public:
  // `unindexed` answers for the volumes that have no finished store. Both outlive this object.
  StoredVolumeCatalog(VolumeStores& stores, VolumeCatalog& unindexed)
      : stores_(stores), unindexed_(unindexed) {}

  std::int32_t makeReference(const std::string& path, FileReference& file) override;
  std::int16_t volumeOf(const FileReference& file, VolumeReference& volume) override;
  std::int16_t objectCounts(const VolumeReference& volume, VolumeObjectCounts& counts) override;

 private:
  VolumeStores& stores_;
  VolumeCatalog& unindexed_;
};

}  // namespace norvex
