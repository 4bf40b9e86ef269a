// The stores of this machine's volumes, each opened and checked once in a process.
//
// Made on the main thread. Used by one thread at a time: the run's, or the main thread while the run waits
// for it.
#pragma once

#include <functional>
#include <map>
#include <memory>
#include <string>

#include "index/MountPoints.h"
#include "index/StoreFolder.h"
#include "index/StoreReader.h"
#include "platform/Result.h"

namespace norvex {

using MountPointTest = std::function<bool(const std::string&)>;

// Whether a volume has a store at all, whatever it is worth.
bool hasStoreFile(const StoreFolder& folder, const std::string& volumeRoot);

// The root of the volume that a path lies on: the nearest folder upwards, the path itself included, at which
// something is mounted, or that has been indexed as a volume of its own. `path` is absolute and normalised.
std::string volumeRootOf(const StoreFolder& folder, const MountPointTest& isMountPoint,
                         const std::string& path);

class VolumeStores {
 public:
  explicit VolumeStores(StoreFolder folder, MountPointTest mountPointTest = isMountPoint)
      : folder_(std::move(folder)), isMountPoint_(std::move(mountPointTest)) {}

  std::string volumeRootOf(const std::string& path) const {
    return norvex::volumeRootOf(folder_, isMountPoint_, path);
  }

  // The store of the volume with this root. The error is StoreReader::open's; it stays the answer for the
  // life of this object, and so does the store: one run sees one state of the index. This object owns the
  // store.
  Result<StoreReader*> storeOf(const std::string& volumeRoot);

  // Damage that shows only while a store is read: from now on the store is not there.
  void giveUp(const StoreReader& store, const Error& error);

 private:
  struct Opened {
    std::unique_ptr<StoreReader> store;  // kept for as long as results may refer to it
    std::optional<Error> error;
  };

  StoreFolder folder_;
  MountPointTest isMountPoint_;
  std::map<std::string, Opened> opened_;  // by root
};

}  // namespace norvex
