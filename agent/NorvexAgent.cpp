// The program: makes the roles as this machine plays them, and hands over to the entry.
#include "agent/main.h"
#include "index/StoreFolder.h"
#include "index/StoredMetadataIndex.h"
#include "index/VolumeStores.h"
#include "platform/Platform.h"
#include "platform/linux/Environment.h"
#include "platform/linux/LinuxActivityScheduler.h"
#include "platform/linux/LinuxPlatform.h"

int main(int argc, char* argv[]) {
  // Before anything else: a request to run that comes this early must wait, not end the process.
  norvex::LinuxActivityScheduler::blockRunSignal();

  norvex::LinuxPlatform linuxPlatform(argc, argv, norvex::processEnvironment());
  norvex::VolumeStores stores(norvex::StoreFolder(linuxPlatform.folders().cache + "/norvex"));
  norvex::StoredMetadataIndex metadataIndex(stores, linuxPlatform.eventLoops());
  norvex::StoredVolumeCatalog volumeCatalog(stores, linuxPlatform.volumeCatalog());
  const norvex::Platform roles = linuxPlatform.roles(metadataIndex, volumeCatalog);
  const norvex::ScopedPlatform installed(roles);
  return norvex::main();
}
