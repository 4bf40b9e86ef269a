#include <gmock/gmock.h>

#include <cerrno>

#include "tests/support/TestPlatform.h"

namespace norvex {
namespace {

using ::testing::ElementsAre;
using ::testing::Pair;

TEST(CallJournal, KeepsTheOrderAcrossRoles) {
  TestPlatform world;
  world.processControl.throttleDiskIO();
  world.systemLog.syslog(LogLevel::error, "no %s");
  world.preferenceStore.setValue("Key", 4, "domain");
  EXPECT_THAT(world.calls.all(), ElementsAre("throttleDiskIO", "syslog 3 no %s", "setValue Key=4"));
  EXPECT_THAT(world.calls.of({"setValue", "throttleDiskIO"}),
              ElementsAre("throttleDiskIO", "setValue Key=4"));
}

TEST(TestPlatform, IsThePlatformWhileItLives) {
  TestPlatform outer;
  {
    TestPlatform inner;
    EXPECT_EQ(&platform().systemLog, &inner.systemLog);
  }
  EXPECT_EQ(&platform().systemLog, &outer.systemLog);
}

TEST(InMemoryActivityScheduler, CallsTheHandlerThatWasRegistered) {
  TestPlatform world;
  world.activityScheduler.registerActivity(
      "job", ActivityCriteria::checkIn, [](Activity& activity) { activity.setState(ActivityState::done); });
  InMemoryActivity activity(world.calls, ActivityState::run);
  world.activityScheduler.deliver(activity);
  EXPECT_EQ(activity.state(), ActivityState::done);
  EXPECT_THAT(world.calls.all(), ElementsAre("registerActivity job", "setState 5"));
}

TEST(InMemoryBackupSettings, CannotBeOpenedWhenAbsent) {
  TestPlatform world;
  EXPECT_EQ(world.backupSettings.open(), nullptr);
  world.backupSettings.content = {true, {"a", "b"}, true, {{"/"}}};
  const auto handle = world.backupSettings.open();
  EXPECT_EQ(world.backupSettings.openHandles, 1);
  EXPECT_TRUE(handle->automaticBackupsEnabled() && handle->systemFilesSkipped());
  EXPECT_THAT(handle->destinations(), ElementsAre("a", "b"));
  EXPECT_THAT(*handle->includedVolumes(), ElementsAre("/"));
}

TEST(InMemoryByteCountFormatter, IsPlain) {
  EXPECT_EQ(InMemoryByteCountFormatter().string(1000), "1000 bytes");
}

TEST(InMemoryDiagnosticLog, KeepsEveryPairInOrder) {
  TestPlatform world;
  const DiagnosticPair pairs[] = {{"b", "1"}, {"a", "2"}};
  world.diagnosticLog.logWithKeys("domain", 5, pairs);
  EXPECT_THAT(world.diagnosticLog.messages.at(0).pairs, ElementsAre(Pair("b", "1"), Pair("a", "2")));
}

TEST(InMemoryInstallation, IsWhatTheTestSays) {
  TestPlatform world;
  EXPECT_FALSE(world.installation.isInternalInstall());
  world.installation.isInternal = true;
  EXPECT_TRUE(world.installation.isInternalInstall());
}

TEST(InMemoryJobRegistry, FailsOnDemand) {
  TestPlatform world;
  world.jobRegistry.failure = systemError(EPERM);
  EXPECT_EQ(world.jobRegistry.disableJob(JobDomain::user, "a").error().code, EPERM);
  world.jobRegistry.failure.reset();
  EXPECT_TRUE(world.jobRegistry.disableJob(JobDomain::user, "b"));
  EXPECT_THAT(world.jobRegistry.disabledJobs, ElementsAre("b"));
}

TEST(InMemoryMediaMetadataReader, KnowsTheFilesNamed) {
  TestPlatform world;
  world.mediaMetadataReader.keysOfFile["/a"] = {std::uint32_t{7}, "seven"};
  EXPECT_EQ(world.mediaMetadataReader.itemKeys(Location::file("/a")).size(), 2U);
  EXPECT_TRUE(world.mediaMetadataReader.itemKeys(Location::file("/b")).empty());
}

TEST(InMemoryMemoryPressureSource, DeliversBetweenResumeAndEnd) {
  TestPlatform world;
  int events = 0;
  auto subscription = world.memoryPressureSource.create({true, false});
  subscription->setHandler([&] { ++events; });
  world.memoryPressureSource.fire();
  EXPECT_EQ(events, 0);
  subscription->resume();
  world.memoryPressureSource.fire();
  EXPECT_EQ(events, 1);
  subscription.reset();
  world.memoryPressureSource.fire();
  EXPECT_EQ(events, 1);
}

TEST(InMemoryPreferenceStore, KeepsWhatIsSetPendingUntilSynchronised) {
  TestPlatform world;
  InMemoryPreferenceStore& store = world.preferenceStore;
  EXPECT_FALSE(store.copyValue("k", "d"));
  store.stored["d"]["k"] = 3;
  store.setValue("k", 4, "d");
  EXPECT_EQ(store.copyValue("k", "d"), 4);
  EXPECT_EQ(store.stored["d"]["k"], 3);
  store.synchronize("d");
  EXPECT_EQ(store.stored["d"]["k"], 4);
}

TEST(InMemoryProcessControl, EndsTheProcessByAnException) {
  TestPlatform world;
  try {
    world.processControl.exit(3);
  } catch (const ProcessExited& end) {
    EXPECT_EQ(end.status, 3);
  }
  EXPECT_THAT(world.calls.all(), ElementsAre("exit 3"));
}

TEST(InMemoryProcessMemoryInfo, FailsOnDemand) {
  TestPlatform world;
  world.processMemoryInfo.use = systemError(EIO);
  EXPECT_FALSE(world.processMemoryInfo.ownProcess());
  world.processMemoryInfo.use = MemoryUse{1, 2};
  EXPECT_EQ(world.processMemoryInfo.ownProcess().value().compressed, 2U);
}

TEST(InMemorySystemControl, AnswersOrFailsAsTheKernelWould) {
  TestPlatform world;
  InMemorySystemControl& control = world.systemControl;
  char buffer[8];
  const auto ask = [&](std::span<const int> name) {
    std::size_t length = sizeof buffer;
    return control.sysctl(name, buffer, &length) == 0 ? static_cast<int>(length) : -errno;
  };
  control.modelName = "seven77";
  EXPECT_EQ(ask(kHardwareModelName), 8);
  EXPECT_STREQ(buffer, "seven77");
  control.modelName = "eight888";
  EXPECT_EQ(ask(kHardwareModelName), -ENOMEM);
  const int other[] = {6, 1};
  EXPECT_EQ(ask(other), -ENOENT);
  control.failure = EPERM;
  EXPECT_EQ(ask(kHardwareModelName), -EPERM);
}

TEST(InMemoryUserFolders, HaveAMadeUpUser) {
  EXPECT_EQ(InMemoryUserFolders().home(), "/Users/user");
}

TEST(InMemoryVolumeCatalog, FailsAtTheStepNamed) {
  using Step = InMemoryVolumeCatalog::Step;
  TestPlatform world;
  InMemoryVolumeCatalog& catalog = world.volumeCatalog;
  catalog.countsOfVolume["/"] = {3, 2};
  for (const Step step : {Step::none, Step::makeReference, Step::volumeOf, Step::objectCounts}) {
    catalog.failingStep = step;
    FileReference file;
    VolumeReference volume;
    VolumeObjectCounts counts;
    EXPECT_EQ(catalog.makeReference("/", file) == 0, step != Step::makeReference);
    EXPECT_EQ(catalog.volumeOf({"/"}, volume) == 0, step != Step::volumeOf);
    EXPECT_EQ(catalog.objectCounts({"/"}, counts) == 0, step != Step::objectCounts);
    EXPECT_EQ(counts.files, step == Step::objectCounts ? 0U : 3U);
  }
  FileReference file;
  EXPECT_NE(catalog.makeReference("/unknown", file), 0);
}

}  // namespace
}  // namespace norvex
