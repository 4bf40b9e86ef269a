#include <gmock/gmock.h>

#include <thread>

#include "scanner/NVXScanner.h"
#include "tests/scanner/ScanWorld.h"

namespace norvex {
namespace {

using ::testing::Each;

// Runs `work` on a thread of its own while the calling thread, the main thread, serves its loop.
template <typename Work>
void besideTheMainLoop(TestPlatform& world, Work work) {
  EventLoop& mainLoop = world.threadedEventLoops.main();
  bool done = false;  // touched on the main thread alone
  std::thread worker([&] {
    work();
    mainLoop.post([&] { done = true; });
  });
  while (!done) mainLoop.runOnce(Clock::Moment::max());
  worker.join();
}

TEST(SearchVolume, HandsOverOnTheMainThreadWhileAnotherThreadWaits) {
  TestPlatform world(TestThreads::several);
  world.metadataIndex.volumes["/v"].matches["p"] = std::vector<IndexedItem>(500, IndexedItem{"/v/a"});
  // Neither is locked: the end of the call is what hands them over, which the thread sanitizer watches.
  std::vector<std::thread::id> handledOn;
  std::size_t handledAtReturn = 0;
  std::thread::id worker;
  besideTheMainLoop(world, [&] {
    worker = std::this_thread::get_id();
    EXPECT_TRUE(NVXScanner().searchVolume(Location::folder("/v"), "p", [&](const MetadataResult&) {
      handledOn.push_back(std::this_thread::get_id());
    }));
    handledAtReturn = handledOn.size();
  });
  EXPECT_EQ(handledAtReturn, 500U);
  EXPECT_THAT(handledOn, Each(std::this_thread::get_id()));
  EXPECT_EQ(world.metadataIndex.queries[0]->startingThread, worker);
  EXPECT_EQ(world.metadataIndex.queries[0]->observingThread, std::this_thread::get_id());
  EXPECT_EQ(world.metadataIndex.queries[0]->observersRemoved, 1);
}

TEST(SearchVolume, ReturnsFromManyCallsOnAnotherThread) {
  TestPlatform world(TestThreads::several);
  world.metadataIndex.volumes["/v"].matches["p"] = {{"/v/a"}, {"/v/b"}};
  world.metadataIndex.volumes["/v"].refused = {"refused"};
  int handled = 0;
  besideTheMainLoop(world, [&] {
    for (int call = 0; call < 50; ++call) {
      const std::string predicate = call % 5 == 4 ? "refused" : "p";
      const bool started = NVXScanner().searchVolume(Location::folder("/v"), predicate,
                                                     [&](const MetadataResult&) { ++handled; });
      EXPECT_EQ(started, predicate == "p");
    }
  });
  EXPECT_EQ(handled, 80);
}

TEST(SearchVolume, WaitsOnTheMainThreadsOwnLoopWhenCalledThere) {
  TestPlatform world(TestThreads::several);
  world.metadataIndex.volumes["/v"].matches["p"] = {{"/v/a"}};
  int handled = 0;
  EXPECT_TRUE(
      NVXScanner().searchVolume(Location::folder("/v"), "p", [&](const MetadataResult&) { ++handled; }));
  EXPECT_EQ(handled, 1);
}

TEST(Scan, GivesTheSameRecordOnAnotherThread) {
  const auto prepare = [](ScanWorld& world) {
    world.files.put("/Users/user/Pictures", folder("Picara Library"));
    world.holds("/", images, "/Users/user/Pictures/Picara Library/a.jpg", 1);
    world.holds("/", music, "/Users/user/Music/Sonpix/a.m4a", 2, true);
    world.holds("/", movies, "/Users/Shared/a.mov", 4);
    world.metadataIndex.volumes["/"].accumulatedSizes = std::vector<std::int64_t>(18, 3);
  };
  std::string onMainThread;
  {
    ScanWorld world;
    prepare(world);
    onMainThread = figures(NVXScanner().scan(), {""});
  }
  ScanWorld world({"/"}, TestThreads::several);
  prepare(world);
  std::string onAnotherThread;
  besideTheMainLoop(world, [&] { onAnotherThread = figures(NVXScanner().scan(), {""}); });
  EXPECT_THAT(onMainThread, ::testing::HasSubstr("moviesInUsersSharedDirectory=4"));
  EXPECT_EQ(onAnotherThread, onMainThread);
}

}  // namespace
}  // namespace norvex
