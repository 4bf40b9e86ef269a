// The real program, started by hand without --force: it waits for the signal that lets it run.
#include <gtest/gtest.h>

#include <unistd.h>

#include <csignal>

#include "AgentWorld.h"

namespace norvex {
namespace {

// Starts the program and lets it run. The signal is blocked until the program takes it, so it counts from the
// start.
int runScheduled(AgentWorld& world, const std::vector<std::string>& arguments) {
  world.beforeExec = [] {
    sigset_t run;
    sigemptyset(&run);
    sigaddset(&run, SIGUSR1);
    sigprocmask(SIG_BLOCK, &run, nullptr);
    kill(getpid(), SIGUSR1);  // not raise(): that would be for this thread alone
  };
  return world.run(arguments);
}

TEST(ScheduledRun, ReportsWhenToldToRun) {
  AgentWorld world;
  EXPECT_EQ(runScheduled(world, {}), 0);
  EXPECT_EQ(world.messages().size(), 2U);
}

TEST(ScheduledRun, ReportsOnceARelease) {
  AgentWorld world;
  EXPECT_EQ(runScheduled(world, {}), 0);
  EXPECT_EQ(runScheduled(world, {}), 0);
  EXPECT_EQ(world.messages().size(), 2U);
}

TEST(ScheduledRun, AnOlderReleasesReportDoesNotCount) {
  AgentWorld world;
  AgentWorld::write(world.preferenceFile(), R"({"LastVersionRun": 3})");
  EXPECT_EQ(runScheduled(world, {}), 0);
  EXPECT_EQ(world.messages().size(), 2U);
}

TEST(ScheduledRun, AnythingButExactlyForceGoesThroughTheGate) {
  for (const char* argument : {"--Force", "-force", "--force=1", "force", "--forc", "--force "}) {
    AgentWorld world;
    AgentWorld::write(world.preferenceFile(), R"({"LastVersionRun": 4})");
    EXPECT_EQ(runScheduled(world, {argument}), 0) << argument;
    EXPECT_TRUE(world.messages().empty()) << argument;
  }
}

TEST(ScheduledRun, ARequestToEndEndsTheWait) {
  for (const int signal : {SIGTERM, SIGINT, SIGHUP}) {
    AgentWorld world;
    const pid_t process = world.start({});
    kill(process, signal);
    EXPECT_EQ(AgentWorld::wait(process), 128 + signal);
    EXPECT_TRUE(world.messages().empty());
  }
}

}  // namespace
}  // namespace norvex
