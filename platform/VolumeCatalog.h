// What a volume's own bookkeeping knows, without walking it.
//
// Called on the thread of the run.
#pragma once

#include <cstdint>
#include <string>

namespace norvex {

// A file that the catalog has resolved. Means something to the catalog that made it alone.
struct FileReference {
  std::string path;
};

// A volume that the catalog knows. Means something to the catalog that made it alone.
struct VolumeReference {
  std::string root;
};

struct VolumeObjectCounts {
  std::uint32_t files = 0;    // everything that is no folder, under each of its names
  std::uint32_t folders = 0;  // without the volume's root
};

// Each step returns 0 and fills its result, or another status and leaves the result as it was.
class VolumeCatalog {
 public:
  virtual ~VolumeCatalog() = default;

  // `path` in the file system's own bytes.
  virtual std::int32_t makeReference(const std::string& path, FileReference& file) = 0;

  virtual std::int16_t volumeOf(const FileReference& file, VolumeReference& volume) = 0;

  // Counts above 2^32 - 1 are given as 2^32 - 1.
  virtual std::int16_t objectCounts(const VolumeReference& volume, VolumeObjectCounts& counts) = 0;
};

}  // namespace norvex
