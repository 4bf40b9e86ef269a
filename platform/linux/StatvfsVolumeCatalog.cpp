#include "platform/linux/StatvfsVolumeCatalog.h"

#include <algorithm>
#include <cerrno>
#include <limits>

#include "platform/linux/VolumeStatistics.h"

namespace norvex {

std::int32_t StatvfsVolumeCatalog::makeReference(const std::string& path, FileReference& file) {
  const Result<struct statvfs> statistics = volumeStatistics(path);
  if (!statistics) return statistics.error().code;
  file.path = path;
  return 0;
}

// Any file of a volume answers for it.
std::int16_t StatvfsVolumeCatalog::volumeOf(const FileReference& file, VolumeReference& volume) {
  volume.root = file.path;
  return 0;
}

std::int16_t StatvfsVolumeCatalog::objectCounts(const VolumeReference& volume, VolumeObjectCounts& counts) {
  const Result<struct statvfs> statistics = volumeStatistics(volume.root);
  if (!statistics) return static_cast<std::int16_t>(statistics.error().code);
  if (statistics.value().f_files == 0) return ENOTSUP;
  counts.files = usedInodes(statistics.value().f_files, statistics.value().f_ffree);
  counts.folders = 0;
  return 0;
}

std::uint32_t usedInodes(std::uint64_t all, std::uint64_t free) {
  const std::uint64_t used = all > free ? all - free : 0;
  return static_cast<std::uint32_t>(std::min<std::uint64_t>(used, std::numeric_limits<std::uint32_t>::max()));
}

}  // namespace norvex
