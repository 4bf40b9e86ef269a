#include "tool/Volumes.h"

#include <sys/stat.h>

#include <array>

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

// Whether the index of the volume `around` has an item for the path, which lies on it.
bool isIndexed(const StoreFolder& stores, const std::string& around, const std::string& path) {
  const auto store = StoreReader::open(stores, around, StoreReader::Check::factsOnly);
  if (!store) return false;
  std::string_view below = std::string_view(path).substr(around.size());
  if (below.starts_with('/')) below.remove_prefix(1);
  const auto item = store.value()->itemAt(below);
  return item && item.value().has_value();
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

const char* reasonText(StoreFault::Kind kind) {
  // In the order of the kinds.
  constexpr std::array<const char*, 6> kReasons{"missing", "unfinished", "damaged",
                                                "tooNew",  "unreadable", "plainFolder"};
  return kReasons[static_cast<std::size_t>(kind)];
}

StoreFault unfinishedFault(const std::string& volume) {
  return {
      StoreFault::Kind::unfinished,
      "the agent reports nothing: the first update of this volume's index is under way or was interrupted; "
      "finish it with: " +
          updateCommand(volume)};
}

StoreFault plainFolderFault(const std::string& volumeAround) {
  const std::string volume = safeText(volumeAround);
  return {StoreFault::Kind::plainFolder,
          "the agent reports nothing as long as this is among the included volumes: nothing is mounted "
          "there, so it "
          "is a plain folder of the volume " +
              volume + ", which never gets an index of its own; mount its volume, or name " + volume +
              " in its place as IncludedVolumes in chronel/backup.conf"};
}

std::vector<NotReadyVolume> volumesNotReady(const ToolWorld& world) {
  std::vector<NotReadyVolume> notReady;
  for (const std::string& volume : chosenVolumes(world, {}).value_or(std::vector<std::string>())) {
    const std::string around = volumeOf(world, volume);
    if (around != volume) {
      // A path that no index knows is passed over by the agent.
      if (isIndexed(world.stores, around, volume)) notReady.push_back({volume, plainFolderFault(around)});
      continue;
    }
    const auto store = StoreReader::open(world.stores, volume, StoreReader::Check::factsOnly);
    if (store && !store.value()->healthCheck()) notReady.push_back({volume, unfinishedFault(volume)});
    if (!store && store.error().code != kStoreMissing)
      notReady.push_back({volume, faultOf(store.error(), world.stores, volume)});
  }
  return notReady;
}

std::string updateCommand(const std::string& volume) {
  return "norvexctl index update " + safeText(quoted(volume));
}

}  // namespace norvex
