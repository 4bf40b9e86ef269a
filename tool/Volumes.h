// Which volumes a command is about.
//
// Called on the main thread.
#pragma once

#include <memory>
#include <optional>
#include <string>
#include <variant>
#include <vector>

#include "index/StoreReader.h"
#include "index/VolumeStores.h"
#include "tool/ToolWorld.h"

namespace norvex {

// The volumes that were named on the command line, as absolute paths without what is redundant in them; else
// the included volumes of the backup settings. Absent when none was named and the settings do not say.
std::optional<std::vector<std::string>> chosenVolumes(const ToolWorld& world,
                                                      const std::vector<std::string>& named);

// The volume that an absolute path lies on, as far as stores go: the nearest folder above it, or itself, that
// is a mount point or has a store. "/" at the last.
std::string volumeOf(const ToolWorld& world, const std::string& path);

// Why a volume's store is of no use. The kinds are what JSON calls "reason".
struct StoreFault {
  enum class Kind { missing, unfinished, damaged, tooNew, unreadable, plainFolder };
  Kind kind = Kind::missing;
  std::string message;  // what, and what to do
};

// The volume's store, complete and believable.
std::variant<std::unique_ptr<StoreReader>, StoreFault> openStore(const StoreFolder& stores,
                                                                 const std::string& volume);

// The kind as JSON has it.
const char* reasonText(StoreFault::Kind kind);

// Why the agent reports nothing as long as it is so. The path is an included one.
StoreFault unfinishedFault(const std::string& volume);
StoreFault plainFolderFault(const std::string& volumeAround);

// Included volumes that keep the agent from reporting.
struct NotReadyVolume {
  std::string root;
  StoreFault fault;
};
// Looks only at what identifies each index, and so is quick; damage behind that shows when it is used.
std::vector<NotReadyVolume> volumesNotReady(const ToolWorld& world);

// The command that makes the volume's index, ready to be copied into a shell.
std::string updateCommand(const std::string& volume);

}  // namespace norvex
