// A volume's object counts for when nothing better is known: its used inodes, all of them as files, since the
// kernel does not tell files and folders apart.
#pragma once

#include "platform/VolumeCatalog.h"

namespace norvex {

// A status is an errno value. ENOTSUP for a volume that has no inodes to count.
class StatvfsVolumeCatalog final : public VolumeCatalog {
 public:
  std::int32_t makeReference(const std::string& path, FileReference& file) override;
  std::int16_t volumeOf(const FileReference& file, VolumeReference& volume) override;
  std::int16_t objectCounts(const VolumeReference& volume, VolumeObjectCounts& counts) override;
};

// The number of files that these totals stand for, at most 2^32 - 1. A volume that claims more free inodes
// than it has holds none.
std::uint32_t usedInodes(std::uint64_t all, std::uint64_t free);

}  // namespace norvex
