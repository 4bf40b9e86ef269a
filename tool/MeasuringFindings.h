// What norvexctl doctor finds of the roles that measure: each is asked what a scan asks it first.
//
// Called on the main thread, with the machine's roles installed. They change nothing.
#pragma once

#include "tool/Doctor.h"

namespace norvex {

Finding homeFolder();
Finding startupVolumeCapacity();
Finding startupVolumeCounts();
Finding ownMemory(const ToolWorld& world);

}  // namespace norvex
