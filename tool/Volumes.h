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
  enum class Kind { missing, unfinished, damaged, tooNew, unreadable };
  Kind kind = Kind::missing;
  std::string message;  // what, and what to do
};

// The volume's store, complete and believable.
std::variant<std::unique_ptr<StoreReader>, StoreFault> openStore(const StoreFolder& stores,
                                                                 const std::string& volume);

// The command that makes the volume's index, ready to be copied into a shell.
std::string updateCommand(const std::string& volume);

}  // namespace norvex
