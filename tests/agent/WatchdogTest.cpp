#include <gmock/gmock.h>

#include <cerrno>
#include <thread>

#include "tests/agent/AgentWorld.h"

namespace norvex {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::SizeIs;

constexpr std::uint64_t kLimit = 1'048'576'000;
constexpr const char* kWatchdogLine = "3 Norvex Memory Watchdog: Critical memory pressure detected. Exiting.";

std::string pressure() {
  try {
    onMemoryPressure();
    return "goes on";
  } catch (const ProcessExited& end) {
    return "exit " + std::to_string(end.status);
  }
}

TEST(Watchdog, EndsAProcessThatHasGrownBeyondTheLimit) {
  const struct {
    std::uint64_t internal;
    std::uint64_t compressed;
    bool ends;
  } rows[] = {
      {0, 0, false},         {kLimit - 1, 0, false}, {kLimit, 0, false},
      {0, kLimit, false},    {kLimit - 5, 5, false}, {kLimit, 1, true},
      {kLimit + 1, 0, true}, {0, kLimit + 1, true},  {600'000'000, 500'000'000, true},
      {UINT64_MAX, 0, true}, {UINT64_MAX, 1, false},  // the sum wraps
  };
  for (const auto& row : rows) {
    AgentWorld world;
    world.processMemoryInfo.use = MemoryUse{row.internal, row.compressed};
    EXPECT_EQ(pressure(), row.ends ? "exit 0" : "goes on") << row.internal << " + " << row.compressed;
    if (row.ends) {
      EXPECT_THAT(world.calls.all(), ElementsAre("ownProcess", std::string("syslog ") + kWatchdogLine,
                                                 "disableJob com.brixo.NorvexAgent",
                                                 "syslog 5 com.brixo.NorvexAgent disabled", "exit 0"));
    } else {
      EXPECT_THAT(world.calls.all(), ElementsAre("ownProcess"));
    }
  }
}

TEST(Watchdog, JudgesEachEventByItself) {
  AgentWorld world;
  world.processMemoryInfo.use = MemoryUse{kLimit, 0};
  for (int event = 0; event < 10; ++event) EXPECT_EQ(pressure(), "goes on");
  world.processMemoryInfo.use = systemError(EIO);
  EXPECT_EQ(pressure(), "goes on");
  EXPECT_THAT(world.systemLog.lines, IsEmpty());
  world.processMemoryInfo.use = MemoryUse{kLimit, 1};
  EXPECT_EQ(pressure(), "exit 0");
}

TEST(Watchdog, EndsTheProcessEvenWhenTheJobCannotBeSwitchedOff) {
  AgentWorld world;
  world.processMemoryInfo.use = MemoryUse{kLimit, 1};
  world.jobRegistry.failure = systemError(EPERM);
  EXPECT_EQ(pressure(), "exit 0");
  EXPECT_THAT(world.systemLog.lines,
              ElementsAre(kWatchdogLine,
                          "3 Failed to disable com.brixo.NorvexAgent, error: Operation not permitted"));
}

TEST(Watchdog, ListensToBothLevelsOnceItHasItsHandler) {
  AgentWorld world;
  startMemoryWatchdog();
  ASSERT_THAT(world.memoryPressureSource.subscriptions, SizeIs(1));
  const auto& subscription = *world.memoryPressureSource.subscriptions[0];
  EXPECT_TRUE(subscription.levels.warning);
  EXPECT_TRUE(subscription.levels.critical);
  EXPECT_TRUE(subscription.resumed);
  EXPECT_FALSE(subscription.handlerSetLate);
  EXPECT_FALSE(subscription.ended);
  world.processMemoryInfo.use = MemoryUse{kLimit, 1};
  EXPECT_THROW(world.memoryPressureSource.fire(), ProcessExited);
}

TEST(Watchdog, DisturbsNoScanWhileTheProcessIsSmall) {
  AgentWorld world;
  startMemoryWatchdog();
  world.metadataIndex.whenStarting = [&] { world.memoryPressureSource.fire(); };
  EXPECT_TRUE(runScanAndReport());
  EXPECT_THAT(world.calls.of({"ownProcess"}), SizeIs(7));
  EXPECT_EQ(world.storedVersion(), 4);
}

TEST(Watchdog, EndsARunThatIsCutShortWithoutReportOrRecord) {
  AgentWorld world;
  startMemoryWatchdog();
  world.processMemoryInfo.use = MemoryUse{kLimit, 1};
  world.metadataIndex.whenStarting = [&] { world.memoryPressureSource.fire(); };
  InMemoryActivity activity(world.calls, ActivityState::run);
  EXPECT_EQ(world.deliver(activity), "exit 0");
  EXPECT_THAT(activity.statesSet, IsEmpty());
  EXPECT_THAT(world.diagnosticLog.messages, IsEmpty());
  EXPECT_EQ(world.storedVersion(), std::nullopt);
  EXPECT_THAT(world.jobRegistry.disabledJobs, ElementsAre(agentLabelText));
}

TEST(Watchdog, DoesNotExistUnderForce) {
  AgentWorld world;
  world.processMemoryInfo.use = MemoryUse{kLimit, kLimit};
  world.metadataIndex.whenStarting = [&] { world.memoryPressureSource.fire(); };
  EXPECT_EQ(world.start({"--force"}), "returns 0");
  EXPECT_THAT(world.memoryPressureSource.subscriptions, IsEmpty());
  EXPECT_THAT(world.calls.of({"ownProcess"}), IsEmpty());
  EXPECT_EQ(world.storedVersion(), 4);
}

}  // namespace
}  // namespace norvex
