#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/time.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <filesystem>
#include <random>
#include <string>
#include <thread>
#include <vector>

#include "TestVolume.h"

namespace norvex {
namespace {

using testing::ElementsAre;

TEST(IndexUpdate, PublishesAStoreThatHasPassedItsCheck) {
  TestVolume volume;
  volume.file("file", "abc");
  const auto summary = volume.update();
  ASSERT_TRUE(summary.ok()) << summary.error().description;
  const auto reader = volume.open();
  ASSERT_TRUE(reader.ok()) << reader.error().description;
  EXPECT_GT(reader.value()->healthCheck().value_or(0), 1'700'000'000);
  EXPECT_EQ(reader.value()->counts()->files, 1U);
  EXPECT_EQ(reader.value()->counts()->folders, 0U);
  EXPECT_EQ(reader.value()->accumulatedSizes()->at(17), 3);
  EXPECT_EQ(summary.value().storeBytes, std::filesystem::file_size(volume.storePath()));
}

TEST(IndexUpdate, KeepsItsFilesToTheUser) {
  TestVolume volume;
  ASSERT_TRUE(volume.update().ok());
  using std::filesystem::perms, std::filesystem::status;
  EXPECT_EQ(status(volume.stores().path()).permissions(), perms::owner_all);
  EXPECT_EQ(status(volume.storePath()).permissions(), perms::owner_read | perms::owner_write);
  EXPECT_TRUE(std::filesystem::exists(volume.stores().cacheFolder() + "/CACHEDIR.TAG"));
}

TEST(IndexUpdate, SaysThatAFirstUpdateIsUnderWay) {
  TestVolume volume;
  volume.file("file");
  bool isSeen = false;
  IndexUpdateOptions options;
  options.progress = [&](const CrawlFigures&) {
    const auto reader = volume.open();
    ASSERT_TRUE(reader.ok()) << reader.error().description;
    EXPECT_FALSE(reader.value()->healthCheck());
    EXPECT_FALSE(reader.value()->counts());
    EXPECT_FALSE(reader.value()->accumulatedSizes());
    EXPECT_FALSE(reader.value()->attribute(kRootItem, kMDStoreLastHealthCheck).value());
    isSeen = true;
  };
  ASSERT_TRUE(volume.update(options).ok());
  EXPECT_TRUE(isSeen);
}

TEST(IndexUpdate, LeavesReadersTheStoreThatTheyOpened) {
  TestVolume volume;
  volume.file("old");
  ASSERT_TRUE(volume.update().ok());
  const auto reader = volume.open();
  ASSERT_TRUE(reader.ok());
  std::filesystem::rename(volume.at("old"), volume.at("new"));
  ASSERT_TRUE(volume.update().ok());
  EXPECT_TRUE(reader.value()->itemAt("old").value());
  EXPECT_FALSE(reader.value()->itemAt("new").value());
  EXPECT_THAT(volume.paths(), ElementsAre("new"));
}

TEST(IndexUpdate, LeavesTheOldStoreWhenCancelled) {
  TestVolume volume;
  volume.file("old");
  ASSERT_TRUE(volume.update().ok());
  volume.file("new");
  std::atomic<bool> cancelled{false};
  IndexUpdateOptions options;
  options.progress = [&](const CrawlFigures&) { cancelled = true; };
  const auto summary = updateIndex(volume.stores(), volume.root(), TestVolume::rules(), options, cancelled);
  ASSERT_FALSE(summary.ok());
  EXPECT_EQ(summary.error().code, ECANCELED);
  EXPECT_THAT(volume.paths(), ElementsAre("old"));
  EXPECT_FALSE(std::filesystem::exists(volume.stores().unfinishedPath(volume.root())));
}

TEST(IndexUpdate, LetsOneUpdateOfAVolumeWorkAtATime) {
  TestVolume volume;
  volume.file("file");
  int refusal = 0;
  IndexUpdateOptions impatient, options;
  impatient.waitForOtherUpdate = false;
  options.progress = [&](const CrawlFigures&) {
    const auto second = volume.update(impatient);
    if (!second) refusal = second.error().code;
  };
  ASSERT_TRUE(volume.update(options).ok());
  EXPECT_EQ(refusal, EBUSY);
  EXPECT_TRUE(volume.update(impatient).ok());
}

TEST(IndexUpdate, WaitsForAnother) {
  TestVolume volume;
  for (int number = 0; number < 500; ++number)
    volume.file("f" + std::to_string(number % 50) + "/" + std::to_string(number));
  std::vector<std::thread> updates;
  std::atomic<int> done{0};
  for (int number = 0; number < 4; ++number)
    updates.emplace_back([&] { done += volume.update().ok() ? 1 : 0; });
  for (std::thread& update : updates) update.join();
  EXPECT_EQ(done, 4);
  EXPECT_EQ(volume.paths().size(), 550U);
}

TEST(IndexUpdate, RemovesWhatAKilledUpdateLeft) {
  TestVolume volume;
  volume.file("file");
  ASSERT_TRUE(volume.update().ok());
  const std::string unfinished = volume.stores().unfinishedPath(volume.root());
  ASSERT_TRUE(std::filesystem::copy_file(volume.storePath(), unfinished));
  ASSERT_TRUE(volume.update().ok());
  EXPECT_FALSE(std::filesystem::exists(unfinished));
}

TEST(IndexUpdate, FailsClearlyForAVolumeThatIsNotThere) {
  TestVolume volume;
  const std::atomic<bool> cancelled{false};
  const auto summary = updateIndex(volume.stores(), volume.at("none"), TestVolume::rules(), {}, cancelled);
  ASSERT_FALSE(summary.ok());
  EXPECT_EQ(summary.error().code, ENOENT);
}

TEST(IndexUpdate, LeavesTheOldStoreWhenAWriteFails) {
  TestVolume volume;
  volume.file("file");
  ASSERT_TRUE(volume.update().ok());
  for (int number = 0; number < 5000; ++number) volume.file("many/" + std::to_string(number));
  // The limit of a file's size stands for a disk that has no more room.
  const ChildEnd end = inChild([&] {
    std::signal(SIGXFSZ, SIG_IGN);
    const struct rlimit limit { 100'000, 100'000 };
    if (::setrlimit(RLIMIT_FSIZE, &limit) != 0) return 2;
    const auto summary = volume.update();
    // SQLite does not always pass the errno on.
    return !summary && (summary.error().code == EFBIG || summary.error().code == EIO) ? 0 : 3;
  });
  EXPECT_TRUE(end.isClean()) << end.status;
  EXPECT_THAT(volume.paths(), ElementsAre("file"));
  EXPECT_FALSE(std::filesystem::exists(volume.stores().unfinishedPath(volume.root())));
}

// Ends the process, without a last word, `microseconds` from now.
void dieIn(long microseconds) {
  const struct itimerval moment {
    {0, 0}, { 0, microseconds }
  };
  ::setitimer(ITIMER_REAL, &moment, nullptr);
}

TEST(IndexUpdate, LeavesAWholeStoreWheneverItIsKilled) {
  constexpr int kKills = 200;
  constexpr std::size_t kItems = 660;
  TestVolume volume;
  for (int number = 0; number < 600; ++number)
    volume.file("f" + std::to_string(number % 60) + "/" + std::to_string(number));
  const auto start = std::chrono::steady_clock::now();
  ASSERT_TRUE(volume.update().ok());
  using std::chrono::duration_cast, std::chrono::microseconds;
  const long whole = duration_cast<microseconds>(std::chrono::steady_clock::now() - start).count();
  std::mt19937 random(20240501);
  std::uniform_int_distribution<long> moments(1, 2 * whole);
  int killed = 0;
  for (int round = 0; killed < kKills && round < 20 * kKills; ++round) {
    // Each third attempt is a volume's first update.
    if (round % 3 == 0) std::filesystem::remove(volume.storePath());
    const bool hadStore = std::filesystem::exists(volume.storePath());
    const long moment = moments(random);
    const ChildEnd end = inChild([&] {
      dieIn(moment);
      return volume.update().ok() ? 0 : 1;
    });
    if (!WIFSIGNALED(end.status)) {
      ASSERT_TRUE(end.isClean()) << end.status;
      continue;
    }
    ++killed;
    const auto reader = volume.open();
    const bool isNone = !reader && reader.error().code == kStoreMissing;
    ASSERT_TRUE(reader.ok() || (isNone && !hadStore))
        << reader.error().description << " after " << moment << " us";
    if (reader.ok() && reader.value()->healthCheck()) {
      ASSERT_EQ(volume.paths().size(), kItems);
    }
  }
  EXPECT_EQ(killed, kKills);
  ASSERT_TRUE(volume.update().ok());
  EXPECT_EQ(volume.paths().size(), kItems);
}

}  // namespace
}  // namespace norvex
