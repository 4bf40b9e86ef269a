#include "index/AccumulatedSizes.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <limits>
#include <numeric>

namespace norvex {
namespace {

constexpr std::int64_t kLimit = std::numeric_limits<std::int64_t>::max();

TEST(AccumulatedSizes, BeginsWithNothing) {
  EXPECT_THAT(AccumulatedSizes().values(), testing::Each(0));
}

TEST(AccumulatedSizes, AddsToTheNamedPositionOnly) {
  for (std::size_t position = 0; position < kStoragePositionCount; ++position) {
    AccumulatedSizes sizes;
    sizes.add(static_cast<StoragePosition>(position), 5);
    sizes.add(static_cast<StoragePosition>(position), 7);
    EXPECT_EQ(sizes.values()[position], 12);
    EXPECT_EQ(std::accumulate(sizes.values().begin(), sizes.values().end(), std::int64_t{0}), 12);
  }
}

struct SaturationCase {
  std::uint64_t first;
  std::uint64_t second;
  std::int64_t sum;
};

TEST(AccumulatedSizes, StaysAtTheLimit) {
  constexpr auto limit = static_cast<std::uint64_t>(kLimit);
  constexpr SaturationCase cases[] = {
      {limit, 0, kLimit},
      {limit - 1, 1, kLimit},
      {limit - 2, 1, kLimit - 1},
      {limit, 1, kLimit},
      {limit, limit, kLimit},
      {1, limit, kLimit},
      {0, limit + 1, kLimit},
      {0, std::numeric_limits<std::uint64_t>::max(), kLimit},
      {limit, std::numeric_limits<std::uint64_t>::max(), kLimit},
  };
  for (const SaturationCase& each : cases) {
    AccumulatedSizes sizes;
    sizes.add(StoragePosition::music, each.first);
    sizes.add(StoragePosition::music, each.second);
    EXPECT_EQ(sizes.values()[9], each.sum) << each.first << " + " << each.second;
  }
}

TEST(AccumulatedSizes, MergesPositionByPosition) {
  AccumulatedSizes one;
  AccumulatedSizes other;
  one.add(StoragePosition::images, 3);
  other.add(StoragePosition::images, 4);
  other.add(StoragePosition::other, static_cast<std::uint64_t>(kLimit));
  one.add(StoragePosition::other, 1);
  one.merge(other);
  EXPECT_EQ(one.values()[12], 7);
  EXPECT_EQ(one.values()[17], kLimit);
  EXPECT_EQ(one.values()[0], 0);
}

}  // namespace
}  // namespace norvex
