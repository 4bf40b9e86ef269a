// All roles as this machine plays them: the Linux ones, and those that the metadata index answers for.
//
// Made once by the main of each program that measures - the agent, and the companion command, whose figures
// must be the agent's own - and kept to its end. On the main thread, before any other is started.
#pragma once

#include "index/StoreFolder.h"
#include "index/StoredMetadataIndex.h"
#include "index/VolumeStores.h"
#include "platform/Platform.h"
#include "platform/linux/Environment.h"
#include "platform/linux/LinuxPlatform.h"

namespace norvex {

class MachinePlatform {
 public:
  // The command line as main got it, the environment of the process, and where lines for the system log go;
  // `systemLog` outlives this object. Touches no file; each store is opened when it is first asked for.
  MachinePlatform(int argc, const char* const* argv, const Environment& environment, SystemLog& systemLog);

  // References to the roles of this object, which outlives whoever uses them.
  const Platform& roles() const { return roles_; }

  const StoreFolder& storeFolder() const { return storeFolder_; }
  const XdgFolders& folders() const { return linux_.folders(); }

 private:
  LinuxPlatform linux_;
  StoreFolder storeFolder_;
  VolumeStores stores_;
  StoredMetadataIndex metadataIndex_;
  StoredVolumeCatalog volumeCatalog_;
  Platform roles_;
};

}  // namespace norvex
