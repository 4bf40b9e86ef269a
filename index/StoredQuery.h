// A query over the stores of volumes.
//
// Gathers the numbers of matching items, 8 bytes a match, piece by piece as inputs of the starting thread's
// loop; what a match says of itself is read from the store when it is asked for. Thread rules:
// platform/MetadataIndex.h.
#pragma once

#include <memory>

#include "index/VolumeStores.h"
#include "platform/EventLoop.h"
#include "platform/MetadataIndex.h"

namespace norvex {

// `stores` and `loops` outlive the query and its results.
std::unique_ptr<MetadataQuery> makeStoredQuery(VolumeStores& stores, EventLoops& loops);

// One item of a store, as a match or by its path. `store` outlives it.
class StoredResult final : public MetadataResult {
 public:
  StoredResult(StoreReader& store, std::int64_t item) : store_(store), item_(item) {}

  // What cannot be read reads as absent.
  std::optional<MetadataValue> valueForAttribute(std::string_view attribute) const override;

 private:
  StoreReader& store_;
  std::int64_t item_;
};

}  // namespace norvex
