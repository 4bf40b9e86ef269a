// A volume whose store is queried on one thread.
#pragma once

#include <string>
#include <vector>

#include "TestVolume.h"
#include "index/StoredQuery.h"
#include "tests/support/TestPlatform.h"

namespace norvex {

struct QueriedVolume {
  TestPlatform world;
  TestVolume volume;
  VolumeStores stores{volume.stores()};

  // The paths of the matches below the volume, in the query's order; "did not start" when it did not.
  std::vector<std::string> search(const std::string& predicate);
};

void turnUntilStopped(TestPlatform& world, MetadataQuery& query);

}  // namespace norvex
