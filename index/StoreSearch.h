// The items of one store that match a predicate, found piece by piece, so that whoever searches comes to
// other things in between.
//
// Used by the index's queries and by norvexctl, on the thread that has the store.
#pragma once

#include <cstdint>
#include <utility>
#include <vector>

#include "index/PredicateSql.h"
#include "index/StoreReader.h"
#include "platform/Result.h"

namespace norvex {

class StoreSearch {
 public:
  // Begins a search. `store` outlives it. Errors: StoreReader's.
  static Result<StoreSearch> begin(StoreReader& store, const PredicateSql& predicate);

  // Whether every match has been found, or no more can be.
  bool isDone() const { return next_ > last_; }

  // Appends the matches among the next items, by their numbers, in ascending order. May append none: a piece
  // is bounded by the work that it takes, some milliseconds, whether much matches or nothing. On an error
  // `matches` stays as it was and the search is done.
  Result<void> findMore(std::vector<std::int64_t>& matches);

 private:
  StoreSearch(StoreReader& store, StoreStatement rows, std::int64_t last)
      : store_(&store), rows_(std::move(rows)), last_(last) {}

  Result<void> findBetween(std::int64_t first, std::int64_t last, std::vector<std::int64_t>& matches);

  StoreReader* store_;
  StoreStatement rows_;
  std::int64_t next_ = kRootItem;
  std::int64_t last_;
  std::int64_t length_ = 16'384;  // how many items the next piece looks at
};

}  // namespace norvex
