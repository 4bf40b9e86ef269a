// norvexctl index status: what the indexes of volumes say.
#pragma once

#include <string>
#include <vector>

#include "tool/ExitStatus.h"
#include "tool/ToolWorld.h"

namespace norvex {

struct IndexStatusRequest {
  std::vector<std::string> volumes;  // none: the included volumes of the backup settings, "/" without those
  bool json = false;
};

// Fails when a volume has no index or one that cannot be used; the others are shown.
ExitStatus runIndexStatus(ToolWorld& world, const IndexStatusRequest& request);

}  // namespace norvex
