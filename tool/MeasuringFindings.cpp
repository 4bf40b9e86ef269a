#include "tool/MeasuringFindings.h"

#include "platform/Platform.h"
#include "tool/SafeText.h"

namespace norvex {
namespace {

using State = Finding::State;

constexpr const char* kStartupVolume = "/";

}  // namespace

Finding homeFolder() {
  const std::string role = "Home folder";
  const std::string& home = platform().userFolders.home();
  if (platform().directoryListing.names(home)) return {role, State::works, safeText(home), ""};
  return {role, State::broken, safeText(home) + " cannot be read; nothing in it is measured",
          "set HOME to your home folder"};
}

Finding startupVolumeCapacity() {
  const std::string role = "Capacity";
  const auto capacity =
      platform().resourceValues.value(Location::folder(kStartupVolume), ResourceKey::VolumeTotalCapacity);
  if (capacity.ok() && capacity.value())
    return {role, State::works, "the file system tells how large it is and how much is free", ""};
  const std::string reason =
      capacity.ok() ? "the file system does not tell it" : capacity.error().description;
  return {role, State::broken, reason + "; capacities are reported as 0", "see whether df / works"};
}

Finding startupVolumeCounts() {
  const std::string role = "Object counts";
  VolumeCatalog& catalog = platform().volumeCatalog;
  FileReference file;
  VolumeReference volume;
  VolumeObjectCounts counts;
  const bool isKnown = catalog.makeReference(kStartupVolume, file) == 0 &&
                       catalog.volumeOf(file, volume) == 0 && catalog.objectCounts(volume, counts) == 0;
  if (!isKnown)
    return {role, State::fallsBack, "the startup volume does not count its files; 0 are reported",
            "make the index with: norvexctl index update /"};
  // A volume without folders is one whose index does not exist: inodes do not tell what they are.
  if (counts.folders == 0)
    return {role, State::fallsBack, "the file system's inodes are counted as files, and no folders",
            "make the index with: norvexctl index update /"};
  return {role, State::works, "from the index of the startup volume", ""};
}

Finding ownMemory(const ToolWorld& world) {
  const std::string role = "Own memory";
  const auto use = platform().processMemoryInfo.ownProcess();
  if (use.ok())
    return {role, State::works,
            "measured; this process takes " +
                world.byteCounts.string(use.value().internal + use.value().compressed),
            ""};
  return {role, State::fallsBack, use.error().description + "; the agent goes on however large it grows",
          "mount /proc"};
}

}  // namespace norvex
