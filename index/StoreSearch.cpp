#include "index/StoreSearch.h"

#include <algorithm>
#include <utility>

#include "index/PredicateFunctions.h"

namespace norvex {
namespace {

// In thousands of SQLite's instructions: about 10 ms.
constexpr std::int64_t kWorkOfAPiece = 1'000;

// A piece of so few items is run to its end, whatever the predicate makes of each.
constexpr std::int64_t kFewestItems = 256;
constexpr std::int64_t kMostItems = std::int64_t{1} << 62U;

}  // namespace

Result<StoreSearch> StoreSearch::begin(StoreReader& store, const PredicateSql& predicate) {
  auto newest = store.prepare("SELECT max(id) FROM items");
  if (!newest) return newest.error();
  if (sqlite3_step(newest.value().get()) != SQLITE_ROW) return store.lastError();
  // One less than the greatest number, so that there is one behind the last item.
  const std::int64_t last =
      std::min(sqlite3_column_int64(newest.value().get(), 0), sqlite3_int64{INT64_MAX - 1});
  auto rows = store.prepare(queryOf(predicate));
  if (!rows) return rows.error();
  if (const auto bound = bindPredicateValues(rows.value().get(), predicate); !bound) return bound.error();
  return StoreSearch(store, std::move(rows).value(), last);
}

Result<void> StoreSearch::findMore(std::vector<std::int64_t>& matches) {
  const std::size_t before = matches.size();
  const std::int64_t end = last_ - next_ < length_ ? last_ : next_ + length_ - 1;
  store_->allowWork(length_ > kFewestItems ? kWorkOfAPiece : StoreReader::kAllWork);
  auto found = findBetween(next_, end, matches);
  if (found) {
    // SQLite finds them type by type.
    std::sort(matches.begin() + static_cast<std::ptrdiff_t>(before), matches.end());
    next_ = end + 1;
    if (store_->workDone() * 4 < kWorkOfAPiece) length_ = length_ > kMostItems / 2 ? kMostItems : length_ * 2;
    return {};
  }
  matches.resize(before);
  if (!store_->isWorkUsedUp()) {
    next_ = last_ + 1;
    return found;
  }
  if (length_ <= kFewestItems) {
    next_ = last_ + 1;
    return damagedStore("a search of it would not end");
  }
  length_ = std::max(length_ / 16, kFewestItems);  // the same items again, in smaller pieces
  return {};
}

// Appends the matches from the item `first` to the item `last`, in any order.
Result<void> StoreSearch::findBetween(std::int64_t first, std::int64_t last,
                                      std::vector<std::int64_t>& matches) {
  bindItemRange(rows_.get(), first, last);
  int status = SQLITE_ROW;
  while ((status = sqlite3_step(rows_.get())) == SQLITE_ROW) {
    matches.push_back(sqlite3_column_int64(rows_.get(), 0));
  }
  if (status == SQLITE_DONE) {
    sqlite3_reset(rows_.get());
    return {};
  }
  const Error error = store_->lastError();
  sqlite3_reset(rows_.get());
  return error;
}

}  // namespace norvex
