// The queries of the scan run from indexes: a volume has millions of items, and few of them match.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>
#include <variant>
#include <vector>

#include "PredicateWorld.h"
#include "index/PredicateParser.h"

namespace norvex {
namespace {

using test::PredicateWorld;
using testing::AnyOf;
using testing::HasSubstr;
using testing::Not;

const std::vector<std::string>& predicatesOnTypes() {
  static const std::vector<std::string> predicates{
      "kMDItemContentTypeTree == 'public.image'",
      "kMDItemContentTypeTree == 'public.audio'",
      "kMDItemContentTypeTree == 'public.movie' || kMDItemContentTypeTree == 'public.video'",
      "kMDItemContentType == 'com.brixo.sonpix.ipa'",
      "kMDItemContentType == 'com.vmware.vm-package' || kMDItemContentType == 'com.parallels.vm.vmpackage' "
      "|| "
      "kMDItemKind == 'Virtual Disk Image'",
  };
  return predicates;
}

const std::vector<std::string>& predicatesOnSparseAttributes() {
  static const std::vector<std::string> predicates{
      "com_brixo_backup_excludeItem == 'com.brixo.backupd'",
      "kMDItemDovecartHasReceipt=1",
      "kMDItemDovecartHasReceipt == *",
      "InRange(kMDItemRating, 3, 5)",
      "kMDItemComment == '*holiday*'c",
      "kMDItemDovecartHasReceipt=1 && kMDItemFSSize > 1000",
      "kMDItemDovecartHasReceipt=1 || kMDItemRating > 3",
  };
  return predicates;
}

constexpr const char* kEveryItem = "SEARCH i USING INTEGER PRIMARY KEY (rowid>? AND rowid<?)";

std::string planOf(const PredicateWorld& world, const std::string& text) {
  return world.planOf(std::get<Predicate>(parsePredicate(text)));
}

void fill(PredicateWorld& world) {
  world.execute("BEGIN");
  for (std::int64_t type = 1; type <= 40; ++type) {
    const std::string name = "type" + std::to_string(type);
    world.add({type, name, "Kind of " + name, {name, type % 4 == 0 ? "public.image" : "public.data"}});
  }
  for (std::int64_t id = 1; id <= 4000; ++id) {
    test::WorldItem item{id, "name" + std::to_string(id), id, id, id % 40 + 1, {}};
    if (id % 500 == 0) item.sparse["kMDItemDovecartHasReceipt"] = std::int64_t{1};
    world.put(item);
  }
  world.execute("COMMIT");
}

void expectIndexes(const PredicateWorld& world) {
  for (const auto& predicate : predicatesOnTypes()) {
    const std::string plan = planOf(world, predicate);
    EXPECT_THAT(plan,
                HasSubstr("SEARCH i USING COVERING INDEX items_by_type (type=? AND rowid>? AND rowid<?)"))
        << predicate;
    EXPECT_THAT(plan, Not(AnyOf(HasSubstr("SCAN i"), HasSubstr(kEveryItem)))) << predicate << "\n" << plan;
  }
  for (const auto& predicate : predicatesOnSparseAttributes()) {
    const std::string plan = planOf(world, predicate);
    EXPECT_THAT(plan, HasSubstr("SEARCH attributes USING PRIMARY KEY (name=? AND item>? AND item<?)"))
        << predicate;
    EXPECT_THAT(plan, HasSubstr("SEARCH i USING INTEGER PRIMARY KEY (rowid=?)")) << predicate;
    EXPECT_THAT(plan, Not(HasSubstr("SCAN"))) << predicate << "\n" << plan;
  }
}

TEST(PredicatePlan, RunsFromIndexesOfAnEmptyStore) {
  PredicateWorld world;
  expectIndexes(world);
}

TEST(PredicatePlan, RunsFromIndexesOfAFilledStore) {
  PredicateWorld world;
  fill(world);
  expectIndexes(world);
}

// Shows that the tests above can fail: without its index the items of the range are read one by one.
TEST(PredicatePlan, ReadsEveryItemWhereNoIndexServes) {
  PredicateWorld world;
  EXPECT_THAT(planOf(world, "kMDItemFSSize > 5"), HasSubstr(kEveryItem));
  world.execute("DROP INDEX items_by_type");
  EXPECT_THAT(planOf(world, predicatesOnTypes().front()), HasSubstr(kEveryItem));
}

}  // namespace
}  // namespace norvex
