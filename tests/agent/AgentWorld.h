// A platform for the agent's entry, and one process of the agent on it, told by what it did.
#pragma once

#include <optional>
#include <string>

#include "agent/main.h"
#include "tests/scanner/ScanWorld.h"

namespace norvex {

inline constexpr const char* agentLabelText = "com.brixo.NorvexAgent";

// What a scan of this world gives.
enum class ScanOutcome { record, nothing };

class AgentWorld : public ScanWorld {
 public:
  explicit AgentWorld(ScanOutcome outcome = ScanOutcome::record) {
    metadataIndex.volumes["/"].hasHealthCheck = outcome == ScanOutcome::record;
  }

  // What would be read after a restart.
  std::optional<double> storedVersion() const;
  void storeVersion(double version) { preferenceStore.stored[agentLabelText]["LastVersionRun"] = version; }

  // Runs main() with these arguments behind the program's name: "returns 0", "waits", "exit 0".
  std::string start(std::vector<std::string> arguments = {});

  // Delivers the activity in `state`: "waits" when the handler returned, "exit 0".
  std::string deliver(InMemoryActivity& activity);
  std::string deliver(ActivityState state);
};

}  // namespace norvex
