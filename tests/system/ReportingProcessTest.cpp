// The real program while it reports: who may end it, and how it competes for the disk.
#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/file.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <csignal>
#include <string>
#include <thread>

#include "AgentWorld.h"
#include "ProcessStatus.h"
#include "platform/FileDescriptor.h"
#include "platform/linux/IoPriority.h"

namespace norvex {
namespace {

namespace fs = std::filesystem;

constexpr int kEndingSignals[] = {SIGTERM, SIGINT, SIGHUP};

// The lock that the agent waits for (two seconds a message) before it writes one: the time in which a test
// can look at it.
class HeldMessages {
 public:
  explicit HeldMessages(const AgentWorld& world) {
    AgentWorld::write(world.messagesFile(), "");
    file_ = FileDescriptor(::open(world.messagesFile().c_str(), O_RDONLY | O_CLOEXEC));
    EXPECT_EQ(::flock(file_.number(), LOCK_EX), 0);
  }
  void release() { file_ = FileDescriptor(); }

 private:
  FileDescriptor file_;
};

// False when the process has ended before it came to it.
bool waitUntilItReports(pid_t process) {
  while (!hasSignal(process, "SigIgn", SIGTERM)) {
    if (hasEnded(process)) return false;
    std::this_thread::yield();
  }
  return true;
}

TEST(ReportingProcess, IsNotEndedBetweenTheFirstMessageAndTheRecordOfTheRelease) {
  AgentWorld world;
  HeldMessages messages(world);
  const pid_t process = world.start({"--force"});
  ASSERT_TRUE(waitUntilItReports(process));
  for (const int signal : kEndingSignals) {
    EXPECT_TRUE(hasSignal(process, "SigIgn", signal)) << signal;
    EXPECT_EQ(::kill(process, signal), 0);
  }
  messages.release();
  EXPECT_EQ(AgentWorld::wait(process), 0);
  EXPECT_EQ(world.messages().size(), 2U);
  EXPECT_NE(AgentWorld::read(world.preferenceFile()).value_or("").find("LastVersionRun"), std::string::npos);
}

// Some systems let nobody change it.
bool mayBeIdle() {
  long status = 0;
  std::thread([&] {
    status = ::syscall(SYS_ioprio_set, kIoPriorityOfProcess, 0, ioPriority(kIoClassIdle));
  }).join();
  return status == 0;
}

TEST(ReportingProcess, HasTheLowestDiskPriorityOnAllOfItsThreads) {
  if (!mayBeIdle()) GTEST_SKIP() << "the system forbids ioprio_set";
  AgentWorld world;
  // Started by a signal it has more threads than one: the scheduler's, the watchdog's.
  world.beforeExec = [] {
    sigset_t run;
    sigemptyset(&run);
    sigaddset(&run, SIGUSR1);
    sigprocmask(SIG_BLOCK, &run, nullptr);
    kill(getpid(), SIGUSR1);
  };
  HeldMessages messages(world);
  const pid_t process = world.start({});
  ASSERT_TRUE(waitUntilItReports(process));
  int threads = 0;
  for (const auto& entry : fs::directory_iterator("/proc/" + std::to_string(process) + "/task")) {
    const int thread = std::stoi(entry.path().filename());
    const long priority = ::syscall(SYS_ioprio_get, kIoPriorityOfProcess, thread);
    EXPECT_EQ(ioClassOf(static_cast<int>(priority)), kIoClassIdle) << thread;
    ++threads;
  }
  EXPECT_GE(threads, 3);
  messages.release();
  EXPECT_EQ(AgentWorld::wait(process), 0);
}

}  // namespace
}  // namespace norvex
