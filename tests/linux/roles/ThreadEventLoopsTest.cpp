#include "platform/linux/ThreadEventLoops.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <latch>
#include <vector>

namespace norvex {
namespace {

using testing::ElementsAre;

constexpr auto kNever = Clock::Moment::max();
constexpr auto kPassed = Clock::Moment::min();

TEST(ThreadEventLoop, RunsInputsOneAtATimeInTheOrderPosted) {
  ThreadEventLoop loop;
  std::vector<int> ran;
  for (int input : {1, 2, 3}) loop.post([&ran, input] { ran.push_back(input); });
  EXPECT_TRUE(loop.runOnce(kNever));
  EXPECT_THAT(ran, ElementsAre(1));
  EXPECT_TRUE(loop.runOnce(kNever));
  EXPECT_TRUE(loop.runOnce(kNever));
  EXPECT_THAT(ran, ElementsAre(1, 2, 3));
}

TEST(ThreadEventLoop, APassedDeadlineStillRunsAWaitingInput) {
  for (const Clock::Moment deadline : {kPassed, Clock::Moment{}, std::chrono::steady_clock::now()}) {
    ThreadEventLoop loop;
    bool ran = false;
    EXPECT_FALSE(loop.runOnce(deadline));
    loop.post([&] { ran = true; });
    EXPECT_TRUE(loop.runOnce(deadline));
    EXPECT_TRUE(ran);
    EXPECT_FALSE(loop.runOnce(deadline));
  }
}

TEST(ThreadEventLoop, WaitsUntilTheDeadlineForAnInput) {
  ThreadEventLoop loop;
  const Clock::Moment deadline = std::chrono::steady_clock::now() + std::chrono::milliseconds(20);
  EXPECT_FALSE(loop.runOnce(deadline));
  EXPECT_GE(std::chrono::steady_clock::now(), deadline);
}

TEST(ThreadEventLoop, AnInputFromAnotherThreadWakesIt) {
  ThreadEventLoop loop;
  std::thread::id ranOn;
  std::thread poster([&] { loop.post([&] { ranOn = std::this_thread::get_id(); }); });
  EXPECT_TRUE(loop.runOnce(kNever));
  EXPECT_EQ(ranOn, std::this_thread::get_id());
  poster.join();
}

TEST(ThreadEventLoop, LosesNoInputOfManyThreadsAndKeepsTheOrderOfEach) {
  constexpr int kThreads = 4;
  constexpr int kInputs = 500;
  ThreadEventLoop loop;
  std::vector<std::vector<int>> ran(kThreads);
  std::vector<std::thread> threads;
  for (std::size_t thread = 0; thread < kThreads; ++thread) {
    threads.emplace_back([&, thread] {
      for (int input = 0; input < kInputs; ++input) {
        loop.post([&ran, thread, input] { ran[thread].push_back(input); });
      }
    });
  }
  for (int count = 0; count < kThreads * kInputs; ++count) ASSERT_TRUE(loop.runOnce(kNever));
  for (std::thread& thread : threads) thread.join();
  EXPECT_FALSE(loop.runOnce(kPassed));
  std::vector<int> inOrder(kInputs);
  for (int input = 0; input < kInputs; ++input) inOrder[static_cast<std::size_t>(input)] = input;
  for (const std::vector<int>& inputs : ran) EXPECT_EQ(inputs, inOrder);
}

TEST(ThreadEventLoop, AnInputMayPostAndMayRunTheLoop) {
  ThreadEventLoop loop;
  std::vector<int> ran;
  loop.post([&] {
    loop.post([&] { ran.push_back(1); });
    EXPECT_TRUE(loop.runOnce(kPassed));
    ran.push_back(2);
    loop.post([&] { ran.push_back(3); });
  });
  EXPECT_TRUE(loop.runOnce(kPassed));
  EXPECT_THAT(ran, ElementsAre(1, 2));
  EXPECT_TRUE(loop.runOnce(kPassed));
  EXPECT_THAT(ran, ElementsAre(1, 2, 3));
}

TEST(ThreadEventLoop, RunWaitsForAnInputAndRunsAllThatAreWaiting) {
  ThreadEventLoop loop;
  std::vector<int> ran;
  std::thread poster([&] {
    loop.post([&] {
      ran.push_back(1);
      loop.post([&] { ran.push_back(2); });
    });
  });
  loop.run();
  poster.join();
  EXPECT_THAT(ran, ElementsAre(1, 2));
}

TEST(ThreadEventLoop, ALoopMayEndAsSoonAsItsLastInputHasRun) {
  // The loop's thread ends while the poster may still be inside post(); the thread sanitizer watches.
  for (int round = 0; round < 200; ++round) {
    std::atomic<ThreadEventLoop*> ready{nullptr};
    std::thread owner([&] {
      ThreadEventLoop loop;
      bool ended = false;
      ready.store(&loop);
      ready.notify_one();
      loop.post([] {});
      while (!ended) {
        loop.post([&] { ended = ready.load() == nullptr; });
        loop.runOnce(kNever);
      }
    });
    ready.wait(nullptr);
    ready.load()->post([&] { ready.store(nullptr); });
    owner.join();
  }
}

TEST(ThreadEventLoops, TheConstructingThreadHasTheMainLoop) {
  ThreadEventLoops loops;
  EXPECT_EQ(&loops.current(), &loops.main());
}

TEST(ThreadEventLoops, EveryOtherThreadHasOneOfItsOwn) {
  ThreadEventLoops loops;
  constexpr std::size_t kThreads = 3;
  std::vector<EventLoop*> first(kThreads);
  std::vector<EventLoop*> again(kThreads);
  std::latch allThere(kThreads);
  std::vector<std::thread> threads;
  for (std::size_t index = 0; index < kThreads; ++index) {
    threads.emplace_back([&, index] {
      first[index] = &loops.current();
      again[index] = &loops.current();
      allThere.arrive_and_wait();  // loops of threads that have ended may share an address
    });
  }
  for (std::thread& thread : threads) thread.join();
  EXPECT_EQ(first, again);
  first.push_back(&loops.main());
  std::sort(first.begin(), first.end());
  EXPECT_EQ(std::adjacent_find(first.begin(), first.end()), first.end());
}

TEST(ThreadEventLoops, WorkOnAnotherThreadCanHandItsEndToTheMainLoopAndBeToldBack) {
  ThreadEventLoops loops;
  std::thread::id notifiedOn;
  bool told = false;
  std::thread worker([&] {
    EventLoop& own = loops.current();
    own.post([&] {
      loops.main().post([&] {
        notifiedOn = std::this_thread::get_id();
        own.post([&] { told = true; });
      });
    });
    while (!told) own.runOnce(kNever);
  });
  EXPECT_TRUE(loops.main().runOnce(kNever));
  worker.join();
  EXPECT_EQ(notifiedOn, std::this_thread::get_id());
}

}  // namespace
}  // namespace norvex
