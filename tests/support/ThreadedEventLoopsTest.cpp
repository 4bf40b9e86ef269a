#include "tests/support/ThreadedEventLoops.h"

#include <gtest/gtest.h>

#include <thread>

namespace norvex {
namespace {

TEST(ThreadedEventLoops, HaveALoopForEachThread) {
  ThreadedEventLoops loops;
  EXPECT_EQ(&loops.current(), &loops.main());
  std::thread([&] { EXPECT_NE(&loops.current(), &loops.main()); }).join();
}

TEST(ThreadedEventLoops, RunAnInputOnTheLoopsOwnThread) {
  ThreadedEventLoops loops;
  const std::thread::id mainThread = std::this_thread::get_id();
  std::thread::id ranOn;
  std::thread poster([&] { loops.main().post([&] { ranOn = std::this_thread::get_id(); }); });
  EXPECT_TRUE(loops.main().runOnce(Clock::Moment()));
  poster.join();
  EXPECT_EQ(ranOn, mainThread);
}

}  // namespace
}  // namespace norvex
