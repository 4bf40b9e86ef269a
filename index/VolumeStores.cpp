#include "index/VolumeStores.h"

#include <sys/stat.h>

#include <algorithm>

namespace norvex {

bool hasStoreFile(const StoreFolder& folder, const std::string& volumeRoot) {
  struct stat status {};
  return ::lstat(folder.storePath(volumeRoot).c_str(), &status) == 0;
}

std::string volumeRootOf(const StoreFolder& folder, const MountPointTest& isMountPoint,
                         const std::string& path) {
  std::string root = path;
  while (root.size() > 1 && !isMountPoint(root) && !hasStoreFile(folder, root)) {
    const std::size_t separator = root.rfind('/');
    root.resize(separator == std::string::npos ? 0 : std::max<std::size_t>(separator, 1));
  }
  return root;
}

Result<StoreReader*> VolumeStores::storeOf(const std::string& volumeRoot) {
  const auto [place, isNew] = opened_.try_emplace(normalizedVolumeRoot(volumeRoot));
  Opened& opened = place->second;
  if (isNew) {
    auto store = StoreReader::open(folder_, place->first);
    if (!store.ok()) {
      opened.error = store.error();
    } else {
      opened.store = std::move(store).value();
    }
  }
  if (opened.error) return *opened.error;
  return opened.store.get();
}

void VolumeStores::giveUp(const StoreReader& store, const Error& error) {
  opened_[store.root()].error = error;
}

}  // namespace norvex
