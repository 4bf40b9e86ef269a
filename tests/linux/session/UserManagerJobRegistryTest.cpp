// Switching jobs off and on, with a real manager.
#include "platform/linux/UserManagerJobRegistry.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <chrono>
#include <filesystem>

#include "Session.h"
#include "platform/linux/TimedJob.h"

namespace norvex {
namespace {

using testing::HasSubstr;

Result<void> disable(const std::string& label) {
  return UserManagerJobRegistry(processEnvironment()).disableJob(JobDomain::user, label);
}

std::string described(const Result<void>& outcome) {
  return outcome ? "success" : outcome.error().description;
}

std::string fileStateOf(const std::string& unit) {
  const Result<std::string> state = sessionManager().fileState(unit);
  return state ? state.value() : state.error().description;
}

std::string activeStateOf(const std::string& unit) {
  const Result<UnitStatus> status = sessionManager().status(unit);
  return status ? status.value().activeState : status.error().description;
}

// A job whose timer is enabled and has been started.
std::string startedJob(const std::string& name, const std::string& folder) {
  std::string label = installJob(name, folder);
  UserManager manager = sessionManager();
  EXPECT_TRUE(manager.enable(timerOf(label)));
  EXPECT_TRUE(manager.reload());
  EXPECT_TRUE(manager.startAndWait(timerOf(label)));
  EXPECT_EQ(activeStateOf(timerOf(label)), "active");
  return label;
}

void expectOff(const std::string& label, const std::string& fileState) {
  EXPECT_EQ(fileStateOf(timerOf(label)), fileState);
  EXPECT_EQ(activeStateOf(timerOf(label)), "inactive");
}

TEST(UserManagerJobRegistry, AJobThatIsEnabledForAllUsersGoesOffAndStaysOffUntilItIsSwitchedOn) {
  const std::string label = "com.brixo.Everyone";
  const std::string control = "com.brixo.Everyones.Control";
  ASSERT_EQ(fileStateOf(timerOf(label)), "enabled");
  ASSERT_EQ(activeStateOf(timerOf(label)), "active");
  ASSERT_EQ(described(disable(label)), "success");
  expectOff(label, "masked");

  logOutAndIn();
  ASSERT_TRUE(eventually([&] { return activeStateOf(timerOf(control)) == "active"; }));
  expectOff(label, "masked");
  EXPECT_EQ(described(disable(label)), "success") << "a job that is off already";

  UserManager manager = sessionManager();
  TimedJob job(manager, label);
  EXPECT_FALSE(job.isEnabled().value());
  ASSERT_EQ(described(job.enable()), "success");
  EXPECT_TRUE(job.isEnabled().value());
  EXPECT_EQ(fileStateOf(timerOf(label)), "enabled");
  EXPECT_EQ(activeStateOf(timerOf(label)), "active");
  logOutAndIn();
  EXPECT_TRUE(eventually([&] { return activeStateOf(timerOf(label)) == "active"; }));
}

TEST(UserManagerJobRegistry, AJobThatTheUserEnabledGoesOffAndOnAgain) {
  const std::string label = startedJob("ByUser", unitsOfPackages());
  ASSERT_EQ(described(disable(label)), "success");
  expectOff(label, "masked");
  EXPECT_EQ(described(disable(label)), "success") << "a job that is off already";

  UserManager manager = sessionManager();
  ASSERT_EQ(described(TimedJob(manager, label).enable()), "success");
  EXPECT_EQ(fileStateOf(timerOf(label)), "enabled");
  EXPECT_EQ(activeStateOf(timerOf(label)), "active");
}

TEST(UserManagerJobRegistry, AJobThatWasNeverEnabledCanBeSwitchedOn) {
  const std::string label = installJob("Never", unitsOfPackages());
  UserManager manager = sessionManager();
  TimedJob job(manager, label);
  EXPECT_FALSE(job.isEnabled().value());
  ASSERT_EQ(described(job.enable()), "success");
  EXPECT_EQ(fileStateOf(timerOf(label)), "enabled");
  EXPECT_EQ(activeStateOf(timerOf(label)), "active");
}

TEST(UserManagerJobRegistry, ATimerThatTheUserWroteHimselfIsDisabledAndKept) {
  const std::string label = startedJob("OwnFile", unitsOfUser());
  const std::string file = unitsOfUser() + "/" + timerOf(label);
  ASSERT_EQ(described(disable(label)), "success");
  expectOff(label, "disabled");
  EXPECT_TRUE(std::filesystem::is_regular_file(file));
  EXPECT_EQ(described(disable(label)), "success") << "a job that is off already";

  UserManager manager = sessionManager();
  ASSERT_EQ(described(TimedJob(manager, label).enable()), "success");
  EXPECT_EQ(fileStateOf(timerOf(label)), "enabled");
}

TEST(UserManagerJobRegistry, ATimerThatIsLinkedFromElsewhereIsUnlinkedAndItsFileKept) {
  const std::string elsewhere = std::filesystem::temp_directory_path() / "norvex-session-units";
  const std::string label = installJob("Linked", elsewhere);
  const std::string timer = elsewhere + "/" + timerOf(label);
  ASSERT_TRUE(shell("systemctl --quiet --user link " + elsewhere + "/" + label + ".service"));
  ASSERT_TRUE(shell("systemctl --quiet --user enable --now " + timer));
  ASSERT_EQ(activeStateOf(timerOf(label)), "active");
  EXPECT_EQ(described(disable(label)), "success");
  EXPECT_FALSE(std::filesystem::exists(unitsOfUser() + "/" + timerOf(label)));
  EXPECT_TRUE(std::filesystem::is_regular_file(timer));
  EXPECT_EQ(activeStateOf(timerOf(label)), "inactive");
  std::filesystem::remove_all(elsewhere);
}

TEST(UserManagerJobRegistry, ARunThatIsUnderWayGoesOn) {
  const std::string label = installJob("UnderWay", unitsOfPackages(), "/bin/sleep infinity");
  const std::string service = label + ".service";
  UserManager manager = sessionManager();
  ASSERT_TRUE(manager.start(service));
  ASSERT_TRUE(eventually([&] { return activeStateOf(service) == "activating"; }));
  const std::uint32_t process = manager.lastRun(service).value().process;
  EXPECT_EQ(described(disable(label)), "success");
  EXPECT_NE(process, 0U);
  EXPECT_EQ(manager.lastRun(service).value().process, process);
  ASSERT_TRUE(manager.stop(service));
}

TEST(UserManagerJobRegistry, EveryTimerOfAJobGoesOff) {
  const std::string label = startedJob("TwoTimers", unitsOfPackages());
  const std::string second = "another-name.timer";
  ASSERT_TRUE(shell("sed s/OnActiveSec=1h/OnCalendar=daily/ " + unitsOfPackages() + "/" + timerOf(label) +
                    " >" + unitsOfPackages() + "/" + second));
  ASSERT_TRUE(shell("systemctl --quiet --user enable --now " + second));
  ASSERT_EQ(activeStateOf(second), "active");
  ASSERT_EQ(described(disable(label)), "success");
  expectOff(label, "masked");
  EXPECT_EQ(fileStateOf(second), "masked");
  EXPECT_EQ(activeStateOf(second), "inactive");
}

TEST(UserManagerJobRegistry, AJobThatTheManagerDoesNotKnowIsAFailureAndLeavesNoMask) {
  const Result<void> outcome = disable("com.brixo.Misspelt");
  ASSERT_FALSE(outcome);
  EXPECT_EQ(outcome.error().code, ENOENT);
  EXPECT_EQ(outcome.error().description, "com.brixo.Misspelt.service: no such unit");
  EXPECT_EQ(outputOf("find ~ -name '*Misspelt*'"), "");
}

TEST(UserManagerJobRegistry, AServiceThatNothingTriggersIsNoJob) {
  const std::string label = installJob("Alone", unitsOfPackages());
  ASSERT_TRUE(std::filesystem::remove(unitsOfPackages() + "/" + timerOf(label)));
  ASSERT_TRUE(sessionManager().reload());
  const Result<void> outcome = disable(label);
  ASSERT_FALSE(outcome);
  EXPECT_EQ(outcome.error().code, ENOENT);
  EXPECT_EQ(outcome.error().description, label + ".service: no unit triggers it");
}

TEST(UserManagerJobRegistry, AFolderThatCannotBeWrittenIsAFailureAndTheJobStaysOn) {
  const std::string label = startedJob("Unwritable", unitsOfPackages());
  ASSERT_TRUE(shell("chmod u-w " + unitsOfUser()));
  const Result<void> outcome = disable(label);
  ASSERT_TRUE(shell("chmod u+w " + unitsOfUser()));
  ASSERT_FALSE(outcome);
  EXPECT_THAT(outcome.error().description, HasSubstr("MaskUnitFiles of " + timerOf(label) + ": "));
  EXPECT_EQ(fileStateOf(timerOf(label)), "enabled");
  EXPECT_EQ(activeStateOf(timerOf(label)), "active");
}

// Without the limit the library waits for 25 seconds for an answer and for 90 until the bus has let us in.
constexpr std::chrono::milliseconds kShortLimit{300};
constexpr std::chrono::seconds kFarBelowTheLibrarysLimits{10};

void expectTimeout(const std::string& asked) {
  const auto start = std::chrono::steady_clock::now();
  const Result<void> outcome = UserManagerJobRegistry(processEnvironment(), kShortLimit)
                                   .disableJob(JobDomain::user, "com.brixo.Hangs");
  EXPECT_LT(std::chrono::steady_clock::now() - start, kFarBelowTheLibrarysLimits);
  ASSERT_FALSE(outcome);
  EXPECT_EQ(outcome.error().code, ETIMEDOUT);
  EXPECT_THAT(outcome.error().description, HasSubstr(asked));
}

TEST(UserManagerJobRegistry, AManagerThatHangsIsGivenUpOn) {
  installJob("Hangs", unitsOfPackages());
  const HeldProcess held(kManagerCommand);
  expectTimeout("LoadUnit of com.brixo.Hangs.service: ");
}

TEST(UserManagerJobRegistry, ABusThatHangsIsGivenUpOn) {
  sessionManager();  // starts the bus
  const HeldProcess held(kBusCommand);
  expectTimeout("Session bus: ");
}

TEST(UserManagerJobRegistry, ABusThatIsYetToBeStartedByAManagerThatHangsIsGivenUpOn) {
  ASSERT_TRUE(shell("systemctl --user stop dbus.service"));
  const HeldProcess held(kManagerCommand);
  expectTimeout("Session bus: ");
}

}  // namespace
}  // namespace norvex
