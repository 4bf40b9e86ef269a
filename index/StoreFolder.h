// The folder that holds the stores, one file a volume; who may write there, and how a finished store takes
// its place.
//
// Used by the index's update and readers, on any thread, by several processes at once.
#pragma once

#include <atomic>
#include <string>
#include <string_view>

#include "platform/FileDescriptor.h"
#include "platform/Result.h"

namespace norvex {

class StoreFolder {
 public:
  // `cacheFolder`: the program's own folder below the user's cache folder, an absolute path. Touches nothing.
  explicit StoreFolder(std::string cacheFolder) : cacheFolder_(std::move(cacheFolder)) {}

  const std::string& cacheFolder() const { return cacheFolder_; }
  std::string path() const { return cacheFolder_ + "/index"; }

  // The files of the volume with this root path: different for any two roots, whatever their length and
  // bytes.
  std::string storePath(std::string_view volumeRoot) const;
  std::string unfinishedPath(std::string_view volumeRoot) const;
  std::string lockPath(std::string_view volumeRoot) const;

  // Makes the folder, for the user alone, and marks the cache folder as one that backups may leave out.
  Result<void> prepare() const;

  // Puts the complete unfinished store in the place of the published one, so that it is there also after a
  // loss of power. Readers keep the store that they opened. On failure the published store stays.
  Result<void> publish(std::string_view volumeRoot) const;

 private:
  std::string cacheFolder_;
};

// The right to update a volume's store. At most one process has it; the kernel takes it back when that ends,
// however it ends.
class StoreLock {
 public:
  // Waits until `cancelled` when `wait`; EBUSY when another has it and this is not to wait, ECANCELED when
  // given up.
  static Result<StoreLock> take(const std::string& lockPath, bool wait, const std::atomic<bool>& cancelled);

 private:
  explicit StoreLock(FileDescriptor fd) : fd_(std::move(fd)) {}

  FileDescriptor fd_;
};

// "/home/" and "/home" are one volume.
std::string normalizedVolumeRoot(std::string_view root);

}  // namespace norvex
