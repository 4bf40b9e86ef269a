// The update of one volume's store: crawls the volume into a new store beside the published one, has it
// checked and publishes it.
//
// Called by the companion command, on any thread; by several processes at once. Killed at any moment, it
// leaves the published store as it was.
#pragma once

#include <atomic>
#include <cstdint>
#include <string_view>

#include "index/Crawl.h"
#include "index/CrawlRules.h"
#include "index/StoreFolder.h"
#include "platform/Result.h"

namespace norvex {

struct IndexUpdateOptions {
  bool waitForOtherUpdate = true;  // of the same volume; else it is EBUSY
  CrawlProgress progress;          // may be empty
};

struct IndexUpdateSummary {
  CrawlFigures figures;
  std::uint64_t storeBytes = 0;
};

// Updates the store of the volume at `volumeRoot`, an absolute path. On failure, and with ECANCELED once
// `cancelled` is set, the published store stays as it is; nothing unfinished is left. A store that cannot be
// read is replaced like any other. A volume without one has, from the beginning, a store without a health
// check.
Result<IndexUpdateSummary> updateIndex(const StoreFolder& folder, std::string_view volumeRoot,
                                       const CrawlRules& rules, const IndexUpdateOptions& options,
                                       const std::atomic<bool>& cancelled);

}  // namespace norvex
