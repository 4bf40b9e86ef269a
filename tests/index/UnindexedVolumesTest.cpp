#include "index/UnindexedVolumes.h"

#include <gmock/gmock.h>

#include <thread>

#include "tests/support/TestPlatform.h"

namespace norvex {
namespace {

void turn(TestPlatform& world, int passes) {
  for (int pass = 0; pass < passes; ++pass) world.eventLoops.loop.runOnce(world.clock.now());
}

TEST(UnindexedVolumes, HaveNoItems) {
  TestPlatform world;
  UnindexedVolumes index(world.eventLoops);
  for (const char* path : {"/", "/Volumes/X", "", "/Users/user"}) EXPECT_EQ(index.itemAtPath(path), nullptr);
}

TEST(UnindexedVolumes, StartEveryQueryAndFindNothing) {
  for (const char* predicate : {"kMDItemFSName == '*'", "no predicate at all", ""}) {
    TestPlatform world;
    const auto query = UnindexedVolumes(world.eventLoops).createQuery();
    query->setPredicate(predicate);
    query->setValueListAttributes({"kMDItemPurchaseDate"});
    query->setSearchScopes({Location::folder("/")});
    int told = 0;
    const auto token = query->addFinishObserver([&](MetadataQuery& finished) {
      ++told;
      EXPECT_FALSE(finished.isStopped());
      finished.stop();
      EXPECT_EQ(finished.resultCount(), 0U);
    });
    ASSERT_TRUE(query->start());
    EXPECT_EQ(told, 0) << "the gathering is work of the loop";
    turn(world, 2);
    EXPECT_EQ(told, 1);
    EXPECT_TRUE(query->isStopped());
    query->removeFinishObserver(token);
    turn(world, 1);  // the input that ends the waiting pass
    EXPECT_EQ(told, 1);
  }
}

TEST(UnindexedVolumes, TellNoObserverOfAQueryThatIsGone) {
  TestPlatform world;
  int told = 0;
  {
    const auto query = UnindexedVolumes(world.eventLoops).createQuery();
    const auto token = query->addFinishObserver([&](MetadataQuery&) { ++told; });
    query->start();
    query->removeFinishObserver(token);
  }
  turn(world, 2);
  EXPECT_EQ(told, 0);
}

TEST(UnindexedVolumesThreads, EndTheWaitOfAnotherThread) {
  TestPlatform world(TestThreads::several);
  UnindexedVolumes index(world.threadedEventLoops);
  bool done = false;  // touched on the main thread alone
  std::thread::id toldOn;
  std::thread worker([&] {
    for (int round = 0; round < 50; ++round) {
      const auto query = index.createQuery();
      const auto token = query->addFinishObserver([&](MetadataQuery& finished) {
        finished.stop();
        toldOn = std::this_thread::get_id();
      });
      EXPECT_TRUE(query->start());
      EventLoop& loop = world.threadedEventLoops.current();
      while (!query->isStopped()) loop.runOnce(Clock::Moment::max());
      query->removeFinishObserver(token);
    }
    world.threadedEventLoops.main().post([&] { done = true; });
  });
  while (!done) world.threadedEventLoops.main().runOnce(Clock::Moment::max());
  worker.join();
  EXPECT_EQ(toldOn, std::this_thread::get_id());
}

}  // namespace
}  // namespace norvex
