// norvexctl summary: every figure of a scan, exactly.
#pragma once

#include "tool/ExitStatus.h"
#include "tool/ToolWorld.h"

namespace norvex {

struct SummaryRequest {
  bool updateIndex = true;  // first, as the agent's job does
  bool json = false;
};

// Writes the record's own 92 lines. Fails when the agent would have no record.
ExitStatus runSummary(ToolWorld& world, const SummaryRequest& request);

}  // namespace norvex
