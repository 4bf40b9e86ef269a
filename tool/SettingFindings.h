// What norvexctl doctor finds of what people and administrators have set, and of the data that the figures
// are looked up in.
//
// Called on the main thread, with the machine's roles installed.
#pragma once

#include <vector>

#include "tool/Examination.h"

namespace norvex {

Finding contentTypes(const Examined& examined);
Finding hardwareModel(const Examined& examined);
Finding byteCounts(const Examined& examined);
Finding preferences(const Examined& examined);
Finding installation(const Examined& examined);
Finding indexFolder(const Examined& examined);
Finding backupSettings(const Examined& examined);

// One for each included volume.
std::vector<Finding> includedVolumes(const Examined& examined);

}  // namespace norvex
