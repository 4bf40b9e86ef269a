#include "tool/Volumes.h"

#include <sys/stat.h>

#include <algorithm>
#include <string_view>

#include "platform/Location.h"
#include "tool/SafeText.h"

namespace norvex {
namespace {

// As one word of a shell.
std::string quoted(const std::string& text) {
  static constexpr std::string_view kPlain =
      "abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789/-_.,:+@%";
  if (text.find_first_not_of(kPlain) == std::string::npos) return text;
  std::string word = "'";
  for (const char letter : text) {
    if (letter == '\'') {
      word += "'\\''";
    } else {
      word += letter;
    }
  }
  return word + "'";
}

void appendOnce(std::vector<std::string>& volumes, std::string volume) {
  if (std::find(volumes.begin(), volumes.end(), volume) == volumes.end())
    volumes.push_back(std::move(volume));
}

StoreFault missingStore(const StoreFolder& stores, const std::string& volume) {
  using Kind = StoreFault::Kind;
  struct stat status {};
  if (::stat(volume.c_str(), &status) != 0) {
    return {Kind::missing, "there is no such folder; give the mount point of a volume that is there"};
  }
  if (!hasStoreFile(stores, volume)) {
    return {Kind::missing, "not indexed yet; make the index with: " + updateCommand(volume)};
  }
  return {Kind::missing,
          "another file system is mounted there than the one that was indexed; index it with: " +
              updateCommand(volume)};
}

StoreFault faultOf(const Error& error, const StoreFolder& stores, const std::string& volume) {
  using Kind = StoreFault::Kind;
  const std::string path = safeText(stores.storePath(volume));
  switch (error.code) {
    case kStoreMissing:
      return missingStore(stores, volume);
    case kStoreDamaged:
      return {Kind::damaged,
              "its index " + path + " is damaged; make it anew with: " + updateCommand(volume)};
    case kStoreTooNew:
      return {Kind::tooNew,
              "a later version of this program wrote its index; make it anew with: " + updateCommand(volume)};
    default:
      return {Kind::unreadable,
              "its index " + path + " cannot be read: " + error.description +
                  "; make it readable for you, or remove it and run: " + updateCommand(volume)};
  }
}

}  // namespace

std::optional<std::vector<std::string>> chosenVolumes(const ToolWorld& world,
                                                      const std::vector<std::string>& named) {
  std::vector<std::string> volumes;
  if (!named.empty()) {
    for (const std::string& volume : named) appendOnce(volumes, normalizedPath(world.absolute(volume)));
    return volumes;
  }
  const auto settings = world.backupSettings.open();
  const auto included = settings == nullptr ? std::nullopt : settings->includedVolumes();
  if (!included) return std::nullopt;
  for (const std::string& volume : *included) appendOnce(volumes, normalizedVolumeRoot(volume));
  return volumes;
}

std::string volumeOf(const ToolWorld& world, const std::string& path) {
  return volumeRootOf(world.stores, world.isMountPoint, path);
}

std::variant<std::unique_ptr<StoreReader>, StoreFault> openStore(const StoreFolder& stores,
                                                                 const std::string& volume) {
  auto store = StoreReader::open(stores, volume);
  if (!store) return faultOf(store.error(), stores, volume);
  if (!store.value()->healthCheck()) {
    return StoreFault{
        StoreFault::Kind::unfinished,
        "its first update is under way or was interrupted; finish it with: " + updateCommand(volume)};
  }
  return std::move(store).value();
}

std::string updateCommand(const std::string& volume) {
  return "norvexctl index update " + safeText(quoted(volume));
}

}  // namespace norvex
