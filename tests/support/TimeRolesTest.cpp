#include <gmock/gmock.h>

#include "tests/support/TestPlatform.h"

namespace norvex {
namespace {

using std::chrono::seconds;
using ::testing::ElementsAre;

TEST(InMemoryClock, MovesOnlyForwardAndOnlyWhenTold) {
  InMemoryClock clock;
  const Clock::Moment begin = clock.now();
  clock.advance(seconds(3));
  clock.advanceTo(begin + seconds(2));
  EXPECT_EQ(clock.now(), begin + seconds(3));
}

TEST(InMemoryEventLoop, RunsOneInputAPassInTheOrderPosted) {
  TestPlatform world;
  InMemoryEventLoop& loop = world.eventLoops.loop;
  std::vector<int> ran;
  loop.post([&] { ran.push_back(1); });
  loop.post([&] { ran.push_back(2); });
  EXPECT_TRUE(loop.runOnce(world.clock.now() - seconds(1)));
  EXPECT_THAT(ran, ElementsAre(1));
  EXPECT_TRUE(loop.runOnce(world.clock.now()));
  EXPECT_THAT(ran, ElementsAre(1, 2));
}

TEST(InMemoryEventLoop, MovesTheClockWhileItWaits) {
  TestPlatform world;
  InMemoryEventLoop& loop = world.eventLoops.loop;
  const Clock::Moment begin = world.clock.now();
  bool ran = false;
  loop.postAfter(seconds(7), [&] { ran = true; });
  EXPECT_FALSE(loop.runOnce(begin + seconds(5)));
  EXPECT_EQ(world.clock.now(), begin + seconds(5));
  EXPECT_TRUE(loop.runOnce(begin + seconds(10)));
  EXPECT_EQ(world.clock.now(), begin + seconds(7));
  EXPECT_TRUE(ran);
  EXPECT_EQ(loop.passes[1].begin, begin + seconds(5));
  EXPECT_EQ(loop.passes[1].deadline, begin + seconds(10));
}

TEST(InMemoryEventLoop, SaysWhenItWouldWaitForEver) {
  TestPlatform world;
  EXPECT_THROW(world.eventLoops.loop.runOnce(world.clock.now() + seconds(5)), NothingToWaitFor);
  EXPECT_THROW(world.eventLoops.loop.run(), LoopIsParked);
}

TEST(InMemoryEventLoops, HaveOneLoopOnOneThread) {
  TestPlatform world;
  EXPECT_EQ(&world.eventLoops.current(), &world.eventLoops.main());
}

}  // namespace
}  // namespace norvex
