#include <gmock/gmock.h>

#include "tests/support/TestPlatform.h"

namespace norvex {
namespace {

using ::testing::ElementsAre;

struct Searched {
  explicit Searched(TestPlatform& world, const std::string& predicate)
      : query(world.metadataIndex.createQuery()) {
    query->setPredicate(predicate);
    query->setSearchScopes({Location::folder("/v")});
    token = query->addFinishObserver([this](MetadataQuery& finished) {
      ++observed;
      finished.stop();
      for (std::size_t index = 0; index < finished.resultCount(); ++index) {
        paths.push_back(
            std::get<std::string>(*finished.resultAtIndex(index)->valueForAttribute(kMDItemPath)));
      }
    });
  }

  std::unique_ptr<MetadataQuery> query;
  MetadataQuery::ObserverToken token = 0;
  int observed = 0;
  std::vector<std::string> paths;
};

void turnLoop(TestPlatform& world, int passes) {
  for (int pass = 0; pass < passes; ++pass) world.eventLoops.loop.runOnce(world.clock.now());
}

TEST(InMemoryMetadataIndex, GathersOnTheStartingLoopAndNotifiesOnTheMainLoop) {
  TestPlatform world;
  world.metadataIndex.volumes["/v"].matches["p"] = {{"/v/b"}, {"/v/a"}};
  Searched search(world, "p");
  ASSERT_TRUE(search.query->start());
  turnLoop(world, 1);
  EXPECT_EQ(search.observed, 0);
  turnLoop(world, 1);
  EXPECT_EQ(search.observed, 1);
  EXPECT_TRUE(search.query->isStopped());
  EXPECT_THAT(search.paths, ElementsAre("/v/b", "/v/a"));
}

TEST(InMemoryMetadataIndex, TellsNoObserverThatWasRemoved) {
  TestPlatform world;
  Searched search(world, "p");
  ASSERT_TRUE(search.query->start());
  search.query->removeFinishObserver(search.token);
  turnLoop(world, 2);
  EXPECT_EQ(search.observed, 0);
  EXPECT_EQ(world.metadataIndex.queries[0]->observersRemoved, 1);
}

TEST(InMemoryMetadataIndex, RefusesAQueryOnDemand) {
  TestPlatform world;
  world.metadataIndex.volumes["/v"].refused = {"p"};
  EXPECT_FALSE(Searched(world, "p").query->start());
  Searched other(world, "q");
  EXPECT_TRUE(other.query->start());
  turnLoop(world, 2);
}

TEST(InMemoryMetadataIndex, ShowsOtherCountsOnDemand) {
  TestPlatform world;
  world.metadataIndex.volumes["/v"].matches["p"] = {{"/v/a"}, {"/v/b"}, {"/v/c"}};
  world.metadataIndex.countsShown = {3, 1};
  Searched search(world, "p");
  ASSERT_TRUE(search.query->start());
  turnLoop(world, 2);
  EXPECT_THAT(search.paths, ElementsAre("/v/a"));
}

TEST(InMemoryMetadataIndex, HasItemsForTheRootsThatHaveOne) {
  TestPlatform world;
  world.metadataIndex.volumes["/bare"] = {true, false, std::nullopt, {}, {}};
  world.metadataIndex.volumes["/full"] = {};
  world.metadataIndex.volumes["/none"].hasItem = false;
  EXPECT_EQ(world.metadataIndex.itemAtPath("/none"), nullptr);
  EXPECT_EQ(world.metadataIndex.itemAtPath("/unknown"), nullptr);
  const auto bare = world.metadataIndex.itemAtPath("/bare");
  EXPECT_FALSE(bare->valueForAttribute(kMDStoreLastHealthCheck));
  EXPECT_FALSE(bare->valueForAttribute(kMDStoreAccumulatedSizes));
  const auto full = world.metadataIndex.itemAtPath("/full");
  EXPECT_TRUE(full->valueForAttribute(kMDStoreLastHealthCheck));
  EXPECT_EQ(std::get<std::vector<std::int64_t>>(*full->valueForAttribute(kMDStoreAccumulatedSizes)).size(),
            18U);
  EXPECT_EQ(world.metadataIndex.liveness->now, 2);
}

}  // namespace
}  // namespace norvex
