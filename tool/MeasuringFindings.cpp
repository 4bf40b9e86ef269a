#include "tool/MeasuringFindings.h"

#include "platform/Platform.h"
#include "tool/MediaProbe.h"
#include "tool/SafeText.h"
#include "tool/Volumes.h"

namespace norvex {
namespace {

using State = Finding::State;

constexpr const char* kStartupVolume = "/";

}  // namespace

Finding homeFolder(const Examined&) {
  const std::string role = "Home folder";
  const std::string& home = platform().userFolders.home();
  if (!platform().fileExistence.exists(home))
    return {role, State::broken, safeText(home) + " is not there; nothing in it is measured",
            "set HOME to your home folder"};
  if (!platform().directoryListing.names(home))
    return {role, State::broken, safeText(home) + " cannot be read; nothing in it is measured",
            "make the folder readable for you"};
  return {role, State::works, safeText(home), ""};
}

Finding folderWalk(const Examined&) {
  const std::string role = "Walk of folders";
  const Location home = Location::folder(platform().userFolders.home());
  std::string reason;
  const auto ending = [&reason](const Location& folder, const Error& error) {
    reason = safeText(folder.path()) + ": " + error.description;
    return false;
  };
  constexpr ResourceKey kWanted[] = {ResourceKey::IsDirectory, ResourceKey::TotalFileSize};
  const auto walk = platform().directoryEnumeration.enumerator(home, kWanted, ending);
  const Location* first = walk->next();
  if (!reason.empty())
    return {role, State::broken, reason + "; what lies in folders is not counted",
            "see whether ls -A ~ works"};
  if (first == nullptr) return {role, State::works, "the home folder is empty", ""};
  return {role, State::works,
          "folder by folder, with a second thread where it takes long; the home folder begins with " +
              safeText(first->path().substr(first->path().rfind('/') + 1)),
          ""};
}

Finding fileAttributes(const Examined&) {
  const std::string role = "Attributes of files";
  const Location home = Location::folder(platform().userFolders.home());
  constexpr ResourceKey kWanted[] = {ResourceKey::IsDirectory, ResourceKey::IsPackage};
  const auto values = platform().resourceValues.values(home, kWanted);
  const std::string loss = "; files of which that is so count as 0";
  if (!values)
    return {role, State::broken, safeText(home.path()) + ": " + values.error().description + loss,
            "see whether stat ~ works"};
  const auto isDirectory = values.value().find(ResourceKey::IsDirectory);
  if (isDirectory == values.value().end() || isDirectory->second != 1)
    return {role, State::broken, safeText(home.path()) + " does not show as a folder" + loss, ""};
  return {role, State::works, "as the kernel tells them; folders are told from files", ""};
}

Finding startupVolumeCapacity(const Examined&) {
  const std::string role = "Capacity";
  const auto capacity =
      platform().resourceValues.value(Location::folder(kStartupVolume), ResourceKey::VolumeTotalCapacity);
  if (capacity.ok() && capacity.value())
    return {role, State::works, "the file system tells how large it is and how much is free", ""};
  const std::string reason =
      capacity.ok() ? "the file system does not tell it" : capacity.error().description;
  return {role, State::broken, reason + "; capacities are reported as 0", "see whether df / works"};
}

Finding startupVolumeCounts(const Examined&) {
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

Finding mediaReader(const Examined& examined) {
  const std::string role = "Reader of media files";
  const auto probe = MediaProbe::in(examined.places.temporaryFolder);
  if (!probe) {
    return {role, State::fallsBack, "not tried: no file can be made for it: " + probe.error().description,
            "make room, or name a folder that can be written with TMPDIR"};
  }
  if (platform().mediaMetadataReader.itemKeys(probe.value().file()) == MediaProbe::keys())
    return {role, State::works, "our own; it finds the purchase in a small file", ""};
  return {role, State::broken, "it does not find the purchase in a small file; none is reported", ""};
}

Finding metadataIndex(const Examined& examined) {
  const std::string role = "Metadata index";
  const std::string index = "snapshots in SQLite, one a volume; ";
  const auto volumes = chosenVolumes(examined.world, {}).value_or(std::vector<std::string>());
  if (volumes.empty()) return {role, State::works, index + "there is no volume to ask", ""};
  std::string refusing;
  for (const std::string& volume : volumes) {
    const auto query = platform().metadataIndex.createQuery();
    query->setPredicate("kMDItemContentTypeTree == 'public.image'");
    query->setSearchScopes({Location::folder(volume)});
    if (!query->start()) refusing += (refusing.empty() ? "" : ", ") + safeText(volume);
    query->stop();
  }
  if (refusing.empty()) return {role, State::works, index + "its queries start", ""};
  return {role, State::broken, "its queries do not start on " + refusing + ", so nothing is reported",
          "make the index anew with: norvexctl index update"};
}

Finding ownMemory(const Examined& examined) {
  const std::string role = "Own memory";
  const auto use = platform().processMemoryInfo.ownProcess();
  if (use.ok())
    return {role, State::works,
            "measured; this process takes " +
                examined.world.byteCounts.string(use.value().internal + use.value().compressed),
            ""};
  return {role, State::fallsBack, use.error().description + "; the agent goes on however large it grows",
          "mount /proc"};
}

}  // namespace norvex
