// Makes the indexes of volumes anew for a command, and tells the user how that goes.
//
// Made by a command, on the main thread.
#pragma once

#include <chrono>
#include <cstdint>
#include <optional>
#include <string>

#include "index/CrawlRules.h"
#include "index/IndexUpdate.h"
#include "tool/Faults.h"
#include "tool/ToolWorld.h"

namespace norvex {

struct TimedSummary {
  IndexUpdateSummary update;
  std::chrono::duration<double> elapsed{};

  std::uint64_t items() const { return update.figures.files + update.figures.folders; }
};

class IndexUpdater {
 public:
  // Both outlive this object.
  IndexUpdater(ToolWorld& world, Faults& faults);

  // Updates the index of the volume at this mount point, with a progress line on a terminal; waits for
  // another update of the same volume. Nothing, and a fault, when there is no such volume, the update fails
  // or the user wants to stop; the index is as it was then. Items that cannot be read are told and no fault.
  std::optional<TimedSummary> update(const std::string& volume);

 private:
  Result<IndexUpdateSummary> updateWhenFree(const std::string& volume);
  Result<IndexUpdateSummary> updateOnce(const std::string& volume, bool wait);
  void tellFailure(const std::string& volume, const Error& error);
  void tellStopped(const std::string& volume);
  void tellProblems(const std::string& volume, const CrawlProblems& problems);

  ToolWorld& world_;
  Faults& faults_;
  const CrawlRules rules_;
};

}  // namespace norvex
