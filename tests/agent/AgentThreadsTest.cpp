#include <gmock/gmock.h>

#include <thread>

#include "tests/agent/AgentWorld.h"

namespace norvex {
namespace {

// The handler on the scheduler's queue, the hand-over of matches on the main thread, memory pressure on a
// third.
TEST(Threads, PressureBesideARunOnTheSchedulersQueueDisturbsNothing) {
  ScanWorld world({"/"}, TestThreads::several);
  world.holds("/", images, "/Users/user/a.jpg", 5);
  world.processMemoryInfo.use = MemoryUse{600'000'000, 100'000'000};

  bool done = false;  // touched on the main thread alone
  int status = -1;
  std::thread queue([&] {
    InMemoryActivity activity(world.calls, ActivityState::run);
    try {
      handleActivity(activity);
    } catch (const ProcessExited& end) {
      status = end.status;
    }
    world.threadedEventLoops.main().post([&] { done = true; });
  });
  std::thread pressure([] {
    for (int event = 0; event < 200; ++event) onMemoryPressure();
  });
  while (!done) world.threadedEventLoops.main().runOnce(Clock::Moment::max());
  queue.join();
  pressure.join();

  EXPECT_EQ(status, 0);
  EXPECT_EQ(world.diagnosticLog.messages.size(), 2U);
  EXPECT_EQ(world.calls.of({"ownProcess"}).size(), 200U);
}

TEST(Threads, TheWatchdogEndsTheProcessFromItsOwnThread) {
  AgentWorld world;
  world.processMemoryInfo.use = MemoryUse{1'048'576'000, 1};
  int status = -1;
  std::thread pressure([&] {
    try {
      onMemoryPressure();
    } catch (const ProcessExited& end) {
      status = end.status;
    }
  });
  EXPECT_TRUE(runScanAndReport());
  pressure.join();
  EXPECT_EQ(status, 0);
  EXPECT_THAT(world.jobRegistry.disabledJobs, ::testing::ElementsAre(agentLabelText));
}

}  // namespace
}  // namespace norvex
