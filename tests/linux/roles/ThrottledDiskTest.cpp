#include <gtest/gtest.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <latch>
#include <thread>
#include <vector>

#include "platform/linux/IoPriority.h"
#include "platform/linux/LinuxProcessControl.h"

namespace norvex {
namespace {

long ownIoClass() {
  const long priority = ::syscall(SYS_ioprio_get, kIoPriorityOfProcess, 0);
  return priority < 0 ? priority : ioClassOf(static_cast<int>(priority));
}

bool mayBeIdle() {
  const int idle = ioPriority(kIoClassIdle);
  long status = 0;
  std::thread([&] { status = ::syscall(SYS_ioprio_set, kIoPriorityOfProcess, 0, idle); }).join();
  return status == 0;
}

TEST(ProcessControl, ThrottlesTheThreadsThatAreAndThoseThatWillBe) {
  if (!mayBeIdle()) GTEST_SKIP() << "the system forbids ioprio_set";
  constexpr std::size_t kThreads = 4;
  std::vector<long> before(kThreads);
  std::vector<long> after(kThreads);
  std::vector<long> startedByThem(kThreads);
  std::latch started(kThreads + 1);
  std::latch throttled(1);
  std::vector<std::thread> threads;
  for (std::size_t index = 0; index < kThreads; ++index) {
    threads.emplace_back([&, index] {
      before[index] = ownIoClass();
      started.arrive_and_wait();
      throttled.wait();
      after[index] = ownIoClass();
      std::thread([&, index] { startedByThem[index] = ownIoClass(); }).join();
    });
  }
  started.arrive_and_wait();
  LinuxProcessControl({}).throttleDiskIO();
  throttled.count_down();
  for (std::thread& thread : threads) thread.join();
  long startedLater = -1;
  std::thread([&] { startedLater = ownIoClass(); }).join();

  const std::vector<long> allIdle(kThreads, kIoClassIdle);
  EXPECT_NE(before, allIdle) << "the test was started with the lowest priority and shows nothing";
  EXPECT_EQ(ownIoClass(), kIoClassIdle);
  EXPECT_EQ(after, allIdle);
  EXPECT_EQ(startedByThem, allIdle);
  EXPECT_EQ(startedLater, kIoClassIdle);
}

}  // namespace
}  // namespace norvex
