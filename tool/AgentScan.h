// The scan that the agent would make now, for a command that shows people what comes of it.
//
// On the main thread, with the machine's roles installed.
#pragma once

#include <memory>

#include "results/NVXScannerResults.h"
#include "tool/Faults.h"
#include "tool/ToolWorld.h"

namespace norvex {

// The agent's job updates the indexes of the included volumes before the agent itself starts.
enum class IndexBeforeScan { update, leave };

// The record, of which nothing is sent or kept; with a progress line on a terminal. Nothing when the agent
// would have had nothing to report: the faults say which volume is the reason, and what to do. What cannot be
// measured is told on standard error, adds nothing to its figure and is no fault, as with the agent.
std::unique_ptr<NVXScannerResults> scanAsAgent(ToolWorld& world, Faults& faults, IndexBeforeScan index);

}  // namespace norvex
