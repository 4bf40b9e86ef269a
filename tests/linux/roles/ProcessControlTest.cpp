#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstdlib>

#include "ChildProcess.h"
#include "platform/linux/LinuxProcessControl.h"

namespace norvex {
namespace {

constexpr int kEndingSignals[] = {SIGTERM, SIGINT, SIGHUP};

void block(int signal) {
  sigset_t signals;
  ::sigemptyset(&signals);
  ::sigaddset(&signals, signal);
  ::pthread_sigmask(SIG_BLOCK, &signals, nullptr);
}

TEST(ProcessControl, ArgumentsAreTheCommandLineAsGiven) {
  LinuxProcessControl control({"NorvexAgent", "--force", ""});
  EXPECT_EQ(control.arguments(), (std::vector<std::string>{"NorvexAgent", "--force", ""}));
}

TEST(ProcessControl, AllowedEachEndingSignalEndsTheProcess) {
  for (const int signal : kEndingSignals) {
    const ChildEnd end = inChild([signal] {
      LinuxProcessControl({}).allowSuddenTermination();
      ::raise(signal);
      return std::string("still here");
    });
    EXPECT_TRUE(WIFSIGNALED(end.status)) << signal;
    EXPECT_EQ(WTERMSIG(end.status), signal) << end.report;
  }
}

TEST(ProcessControl, AllowedTheyEndItAlsoWhenItWasStartedWithThemIgnoredAndBlocked) {
  for (const int signal : kEndingSignals) {
    const ChildEnd end = inChild([signal] {
      ::signal(signal, SIG_IGN);
      block(signal);
      LinuxProcessControl({}).allowSuddenTermination();
      ::raise(signal);
      return std::string("still here");
    });
    EXPECT_TRUE(WIFSIGNALED(end.status)) << signal;
    EXPECT_EQ(WTERMSIG(end.status), signal) << end.report;
  }
}

TEST(ProcessControl, DisallowedTheyAreHeldBackUntilTheProcessEndsByItself) {
  const ChildEnd end = inChild([] {
    LinuxProcessControl control({});
    control.allowSuddenTermination();
    control.disallowSuddenTermination();
    for (const int signal : kEndingSignals) ::kill(::getpid(), signal);
    control.exit(0);
    return std::string();
  });
  EXPECT_TRUE(WIFEXITED(end.status));
  EXPECT_EQ(WEXITSTATUS(end.status), 0);
}

TEST(ProcessControl, AllowedAgainTheyEndItAgain) {
  const ChildEnd end = inChild([] {
    LinuxProcessControl control({});
    control.disallowSuddenTermination();
    control.allowSuddenTermination();
    ::raise(SIGTERM);
    return std::string("still here");
  });
  EXPECT_TRUE(WIFSIGNALED(end.status)) << end.report;
}

TEST(ProcessControl, ExitRunsNoExitHandlers) {
  const ChildEnd end = inChild([] {
    std::atexit([] { ::_exit(99); });
    LinuxProcessControl({}).exit(5);
    return std::string();
  });
  EXPECT_TRUE(WIFEXITED(end.status));
  EXPECT_EQ(WEXITSTATUS(end.status), 5);
}

}  // namespace
}  // namespace norvex
