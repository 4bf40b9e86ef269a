// Searches of a store, piece by piece.
#include "index/StoreSearch.h"

#include <gmock/gmock.h>

#include <algorithm>

#include "StoredItems.h"
#include "TestVolume.h"
#include "index/PredicateParser.h"

namespace norvex {
namespace {

// The work that a piece may take, and the unit in which it is found to be too much.
constexpr std::int64_t kMostWorkOfAPiece = 1'001;

struct Found {
  std::vector<std::int64_t> items;
  std::size_t pieces = 0;
  std::int64_t mostWork = 0;  // of one piece
};

Found findAll(StoreReader& store, const char* predicate) {
  auto search = StoreSearch::begin(store, compilePredicate(std::get<Predicate>(parsePredicate(predicate))));
  Found found;
  if (!search) {
    ADD_FAILURE() << search.error().description;
    return found;
  }
  while (!search.value().isDone()) {
    const auto more = search.value().findMore(found.items);
    EXPECT_TRUE(more.ok()) << more.error().description;
    found.mostWork = std::max(found.mostWork, store.workDone());
    ++found.pieces;
  }
  return found;
}

class LargeStore {
 public:
  explicit LargeStore(std::int64_t first, std::int64_t count = kItems) {
    volume_.file("a.jpg");
    EXPECT_TRUE(volume_.update().ok());
    addStoredItems(volume_, first, count);
    auto opened = volume_.open();
    if (opened) store_ = std::move(opened).value();
  }

  StoreReader& operator*() { return *store_; }

  static constexpr std::int64_t kItems = 100'000;

 private:
  TestVolume volume_;
  std::unique_ptr<StoreReader> store_;
};

TEST(StoreSearch, FindsEachMatchOnceInAscendingOrder) {
  LargeStore store(1'000);
  for (const char* predicate :
       {"kMDItemContentTypeTree == 'odd'", "kMDItemContentType == 'one' || kMDItemKind == 'Three'",
        "kMDItemContentType != 'two'"}) {
    const Found found = findAll(*store, predicate);
    EXPECT_GE(found.items.size(), 2U * LargeStore::kItems / 3) << predicate;
    EXPECT_TRUE(std::ranges::is_sorted(found.items, std::ranges::less_equal{})) << predicate;
    EXPECT_EQ(std::ranges::adjacent_find(found.items), found.items.end()) << predicate;
  }
}

TEST(StoreSearch, GivesBackSoonWhereEveryItemIsReadAndNoneMatches) {
  LargeStore store(1'000);
  for (const char* predicate : {"kMDItemFSSize < 0", "kMDItemFSName == 'none'", "kMDItemPath == '*/none'"}) {
    const Found found = findAll(*store, predicate);
    EXPECT_TRUE(found.items.empty()) << predicate;
    EXPECT_GE(found.pieces, 3U) << predicate;
    EXPECT_LE(found.mostWork, kMostWorkOfAPiece) << predicate;
  }
}

TEST(StoreSearch, TakesFewPiecesWhereAnIndexSkipsTheItems) {
  LargeStore store(1'000);
  for (const char* predicate :
       {"kMDItemContentType == 'none'", "kMDItemContentTypeTree == 'none'", "none == 1"}) {
    EXPECT_LE(findAll(*store, predicate).pieces, 6U) << predicate;
  }
}

TEST(StoreSearch, CutsAPieceThatProvesToHoldMoreThanThoseBefore) {
  LargeStore store(std::int64_t{1} << 32U, 4 * LargeStore::kItems);
  const Found found = findAll(*store, "kMDItemContentTypeTree == 'odd'");
  EXPECT_EQ(found.items.size(), 8U * LargeStore::kItems / 3);
  EXPECT_TRUE(std::ranges::is_sorted(found.items));
  EXPECT_EQ(found.mostWork, kMostWorkOfAPiece) << "none was cut";
}

TEST(StoreSearch, EndsAtTheGreatestNumberThatAnItemCanHave) {
  TestVolume volume;
  volume.file("a.jpg");
  ASSERT_TRUE(volume.update().ok());
  volume.tamper("UPDATE items SET id=9223372036854775807 WHERE id=2");
  const auto store = volume.open();
  ASSERT_TRUE(store.ok());
  EXPECT_LE(findAll(*store.value(), "kMDItemContentType == 'none'").pieces, 100U);
}

}  // namespace
}  // namespace norvex
