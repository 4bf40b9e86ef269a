// Facts about one file, folder or volume, asked for by key.
//
// Called on the thread of the run and on the main thread while the run waits.
#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <span>

#include "platform/Location.h"
#include "platform/Result.h"

namespace norvex {

enum class ResourceKey {
  FileSize,             // bytes of the main data stream; absent for folders
  TotalFileSize,        // bytes of all data streams together; a link's own size; absent for folders
  IsDirectory,          // 1 for folders, packages included; 0 for everything else, links to folders included
  IsPackage,            // 1 for folders that people see as one file
  VolumeTotalCapacity,  // bytes of the volume that the location lies on
  VolumeAvailableCapacity,  // bytes of it that nothing occupies
};

using ResourceValue = std::uint64_t;
using ResourceValueTable = std::map<ResourceKey, ResourceValue>;

class ResourceValues {
 public:
  virtual ~ResourceValues() = default;

  // One value. Links are not followed. A success without a value is ordinary: the item has no such value. The
  // facts that a walk left in the location are taken instead of asking the file system again. Whether a
  // folder is a package when that cannot be told: no, as a success.
  virtual Result<std::optional<ResourceValue>> value(const Location& location, ResourceKey key) = 0;

  // Several values in one request. A key that the item has no value for is missing from the table. Fails when
  // the location cannot be read at all.
  virtual Result<ResourceValueTable> values(const Location& location, std::span<const ResourceKey> keys) = 0;
};

}  // namespace norvex
