// What the real manager tells about units.
#include "platform/linux/UserManager.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <chrono>

#include "Session.h"

namespace norvex {
namespace {

using std::chrono::system_clock;
using testing::ElementsAre;

TEST(UserManager, TellsWhatTriggersAService) {
  const std::string label = installJob("Triggered", unitsOfPackages());
  UserManager manager = sessionManager();
  EXPECT_EQ(manager.unitStartedBy(timerOf(label)).value(), label + ".service");
  ASSERT_TRUE(manager.startAndWait(timerOf(label)));
  EXPECT_THAT(manager.triggersOf(label + ".service").value(), ElementsAre(timerOf(label)));
  EXPECT_THAT(manager.triggersOf("dbus.socket").value(), ElementsAre());
}

TEST(UserManager, FindsUnitFilesByPatterns) {
  const std::string label = installJob("Found", unitsOfPackages());
  UserManager manager = sessionManager();
  EXPECT_THAT(manager.unitFiles({label + ".*.timer", label + ".serv?ce"}).value(),
              ElementsAre(timerOf(label), label + ".service"));
  EXPECT_THAT(manager.unitFiles({label}).value(), ElementsAre());
}

TEST(UserManager, AUnitWithoutAFileHasAStatusAndNoFileState) {
  UserManager manager = sessionManager();
  EXPECT_EQ(manager.status("com.brixo.nothing.timer").value().loadState, "not-found");
  const Result<std::string> state = manager.fileState("com.brixo.nothing.timer");
  ASSERT_FALSE(state);
  EXPECT_EQ(state.error().code, ENOENT);
}

TEST(UserManager, ANameThatIsNoneIsAFailure) {
  UserManager manager = sessionManager();
  for (const char* name : {"", "../x.timer", "no-type"}) {
    EXPECT_FALSE(manager.status(name)) << name;
    EXPECT_FALSE(manager.mask(name)) << name;
  }
}

TEST(UserManager, TellsWhenAServiceRanAndHowItEnded) {
  struct Case {
    const char* name;
    const char* command;
    const char* result;
    int status;
  };
  const Case cases[] = {
      {"Succeeds", "/bin/true", "success", 0},
      {"Fails", "/bin/sh -c 'exit 3'", "exit-code", 3},
      {"Killed", "/bin/sh -c 'kill -KILL $$$$'", "signal", 9},
  };
  for (const Case& row : cases) {
    const std::string label = installJob(row.name, unitsOfPackages(), row.command);
    const std::string service = label + ".service";
    UserManager manager = sessionManager();
    ASSERT_TRUE(manager.startAndWait(timerOf(label)));
    EXPECT_FALSE(manager.lastRun(service).value().started) << row.name;
    const auto before = system_clock::now();
    ASSERT_TRUE(manager.start(service)) << row.name;
    ASSERT_TRUE(eventually([&] { return manager.lastRun(service).value().ended.has_value(); })) << row.name;
    const ServiceRun run = manager.lastRun(service).value();
    EXPECT_GE(*run.started, std::chrono::floor<std::chrono::microseconds>(before)) << row.name;
    EXPECT_LE(*run.started, *run.ended) << row.name;
    EXPECT_LE(*run.ended, system_clock::now()) << row.name;
    EXPECT_EQ(run.result, row.result);
    EXPECT_EQ(run.exitStatus, row.status) << row.name;
    EXPECT_EQ(run.process, 0U) << row.name;
  }
}

TEST(UserManager, TellsWhenATimerWillTrigger) {
  const std::string timer = timerOf(installJob("Timed", unitsOfPackages()));
  UserManager manager = sessionManager();
  EXPECT_FALSE(manager.momentsOf(timer).value().next);
  const auto before = system_clock::now();
  ASSERT_TRUE(manager.startAndWait(timer));
  const TimerMoments moments = manager.momentsOf(timer).value();
  EXPECT_FALSE(moments.last);
  EXPECT_GT(*moments.next, before + std::chrono::minutes(59));
  EXPECT_LT(*moments.next, before + std::chrono::minutes(62));
}

}  // namespace
}  // namespace norvex
