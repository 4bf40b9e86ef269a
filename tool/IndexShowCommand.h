// norvexctl index show: everything that the index knows of one item.
#pragma once

#include <string>

#include "tool/ExitStatus.h"
#include "tool/ToolWorld.h"

namespace norvex {

struct IndexShowRequest {
  std::string path;
  bool json = false;
};

// Fails when the index has no item for the path, or the volume that it lies on has no usable index.
ExitStatus runIndexShow(ToolWorld& world, const IndexShowRequest& request);

}  // namespace norvex
