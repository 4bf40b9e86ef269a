// norvexctl index update: makes the indexes of volumes anew.
#pragma once

#include <string>
#include <vector>

#include "tool/ExitStatus.h"
#include "tool/ToolWorld.h"

namespace norvex {

struct IndexUpdateRequest {
  std::vector<std::string> volumes;  // none: the included volumes of the backup settings
  bool json = false;
};

// Updates one volume after the other; one that fails does not keep the others from being updated. Items that
// cannot be read are told, and are no failure. Once the user wants to stop, the volume at hand and those
// after it keep the indexes that they have, and the command has failed.
ExitStatus runIndexUpdate(ToolWorld& world, const IndexUpdateRequest& request);

}  // namespace norvex
