// How many bytes of a volume's regular files are counted at each position.
//
// Each thread of a crawl fills one of its own; they are merged at the end. A plain value.
#pragma once

#include <array>
#include <cstdint>

#include "index/StoragePosition.h"

namespace norvex {

class AccumulatedSizes {
 public:
  using Values = std::array<std::int64_t, kStoragePositionCount>;

  // Adds a file's size in bytes. A position stays at 2^63 - 1 once it would go beyond: damaged or made-up
  // sizes must not turn a sum negative, which readers would take for nothing.
  void add(StoragePosition position, std::uint64_t size);

  // Adds every position of `other`, with the same limit.
  void merge(const AccumulatedSizes& other);

  // Bytes, in the order of the positions; never negative.
  const Values& values() const { return values_; }

 private:
  Values values_{};
};

}  // namespace norvex
