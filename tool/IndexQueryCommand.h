// norvexctl index query: the items that match a predicate.
#pragma once

#include <string>
#include <vector>

#include "tool/ExitStatus.h"
#include "tool/ToolWorld.h"

namespace norvex {

struct IndexQueryRequest {
  std::string predicate;
  std::vector<std::string> volumes;  // none: the included volumes that have an index, "/" without settings
  bool countOnly = false;
  bool nullSeparated = false;
  bool json = false;
};

// Writes one path a line in the order of the index: for a terminal with everything escaped that is not for
// one, else the names' own bytes. A predicate that does not parse is ExitStatus::usage.
ExitStatus runIndexQuery(ToolWorld& world, const IndexQueryRequest& request);

}  // namespace norvex
