// What norvexctl doctor finds of the roles that measure: each is asked what a scan asks it first.
//
// Called on the main thread, with the machine's roles installed.
#pragma once

#include "tool/Examination.h"

namespace norvex {

Finding ownMemory(const Examined& examined);
Finding homeFolder(const Examined& examined);
Finding folderWalk(const Examined& examined);
Finding fileAttributes(const Examined& examined);
Finding startupVolumeCapacity(const Examined& examined);
Finding startupVolumeCounts(const Examined& examined);
Finding mediaReader(const Examined& examined);
Finding metadataIndex(const Examined& examined);

}  // namespace norvex
