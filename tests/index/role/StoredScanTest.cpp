// A whole scan on a thread of its own over a real store and real files, while the clock stands still.
#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <thread>

#include "TestVolume.h"
#include "index/StoredMetadataIndex.h"
#include "media/Boxes.h"
#include "platform/linux/CallablePath.h"
#include "platform/linux/LinuxDirectoryEnumeration.h"
#include "platform/linux/LinuxDirectoryListing.h"
#include "platform/linux/LinuxFileExistence.h"
#include "platform/linux/LinuxResourceValues.h"
#include "platform/linux/Mpeg4MediaReader.h"
#include "platform/linux/StatvfsVolumeCatalog.h"
#include "scanner/NVXScanner.h"
#include "tests/support/TestPlatform.h"

namespace norvex {
namespace {

// The roles that look at files and at the index are real, the others are those of `world`.
class ScannedVolume {
 public:
  ScannedVolume() {
    world_.backupSettings.content.emplace();
    world_.backupSettings.content->includedVolumes = {volume.root()};
    world_.userFolders.homeFolder = volume.root();
  }

  std::unique_ptr<NVXScannerResults> scanOnAnotherThread() {
    EventLoop& mainLoop = world_.threadedEventLoops.main();
    std::unique_ptr<NVXScannerResults> results;
    bool isDone = false;  // touched on the main thread alone
    std::thread worker([&] {
      results = NVXScanner().scan();
      mainLoop.post([&] { isDone = true; });
    });
    while (!isDone) mainLoop.runOnce(Clock::Moment::max());
    worker.join();
    return results;
  }

  const InMemoryClock& clock() const { return world_.clock; }

  TestVolume volume;

 private:
  TestPlatform world_{TestThreads::several};
  LinuxDirectoryEnumeration enumeration_;
  LinuxDirectoryListing listing_;
  LinuxFileExistence existence_;
  LinuxResourceValues values_;
  Mpeg4MediaReader mediaReader_;
  StatvfsVolumeCatalog unindexed_;
  VolumeStores stores_{volume.stores()};
  StoredMetadataIndex index_{stores_, world_.threadedEventLoops};
  StoredVolumeCatalog catalog_{stores_, unindexed_};
  const Platform roles_{world_.activityScheduler,
                        world_.backupSettings,
                        world_.byteCountFormatter,
                        world_.clock,
                        world_.diagnosticLog,
                        enumeration_,
                        listing_,
                        world_.threadedEventLoops,
                        existence_,
                        world_.installation,
                        world_.jobRegistry,
                        mediaReader_,
                        world_.memoryPressureSource,
                        index_,
                        world_.preferenceStore,
                        world_.processControl,
                        world_.processMemoryInfo,
                        values_,
                        world_.systemControl,
                        world_.systemLog,
                        world_.userFolders,
                        catalog_};
  const ScopedPlatform installed_{roles_};
};

// The loops of this world never come to a deadline, and its clock does not move: a wait that ended with one
// of its passes, and not with the work, would have no end.
TEST(StoredScan, WaitsForItsQueriesAndForNoDeadline) {
  ScannedVolume scanned;
  for (int number = 0; number < 50; ++number) {
    const std::string name = "folder/" + std::to_string(number);
    scanned.volume.file(name + ".png", "123");
    scanned.volume.file(name + ".mp3", "12345");
  }
  scanned.volume.file("machine.qcow2", "1234567");
  scanned.volume.file("phone.ipa", "12");
  scanned.volume.file("cache/CACHEDIR.TAG", "Signature: 8a477f597d28d172789f06886806bc55");
  ASSERT_TRUE(scanned.volume.update().ok());
  const Clock::Moment before = scanned.clock().now();

  const auto results = scanned.scanOnAnotherThread();

  ASSERT_NE(results, nullptr);
  EXPECT_EQ(scanned.clock().now(), before);
  EXPECT_EQ(results->imagesInHomeDirectory(), 150U);
  EXPECT_EQ(results->musicInHomeDirectory(), 250U);
  EXPECT_EQ(results->virtualMachinesSize(), 7U);
  EXPECT_EQ(results->kytAppsSize(), 2U);
  EXPECT_EQ(results->chronelStickyExclusionSize(), 43U);
  EXPECT_EQ(results->imagesSize(), 150U);  // of the store's own sums
  EXPECT_EQ(results->allDisksTotalFilesCount(), 103U);
}

TEST(StoredScan, CountsAPurchaseWhosePathIsLongerThanTheKernelTakes) {
  ScannedVolume scanned;
  std::string path = scanned.volume.root();
  for (int level = 0; level < 60; ++level) {
    path += '/' + std::string(200, 'd');
    const CallablePath folder(path);
    ASSERT_EQ(::mkdirat(folder.folder(), folder.path(), 0755), 0);
  }
  const std::string bytes = joined({fileType(), movie({item("purd")})}).text();
  const CallablePath song(path + "/song.m4a");
  const FileDescriptor file(::openat(song.folder(), song.path(), O_CREAT | O_WRONLY | O_CLOEXEC, 0600));
  ASSERT_EQ(::write(file.number(), bytes.data(), bytes.size()), static_cast<ssize_t>(bytes.size()));
  ASSERT_TRUE(scanned.volume.update().ok());

  const auto results = scanned.scanOnAnotherThread();

  ASSERT_NE(results, nullptr);
  EXPECT_EQ(results->sonpixStoreMusicSize(), bytes.size());
}

TEST(StoredScan, ReportsNothingBeforeTheFirstUpdateIsDone) {
  ScannedVolume scanned;
  scanned.volume.file("a.png");
  std::atomic<bool> cancelled{true};
  ASSERT_FALSE(
      updateIndex(scanned.volume.stores(), scanned.volume.root(), TestVolume::rules(), {}, cancelled).ok());
  EXPECT_EQ(scanned.scanOnAnotherThread(), nullptr);
}

}  // namespace
}  // namespace norvex
