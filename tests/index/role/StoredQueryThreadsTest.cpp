// Queries as a scheduled run makes them: started on one thread, their results handled on the main thread.
#include <gtest/gtest.h>

#include <atomic>
#include <thread>

#include "StoredItems.h"
#include "TestVolume.h"
#include "index/StoredMetadataIndex.h"
#include "scanner/NVXScanner.h"
#include "tests/support/TestPlatform.h"

namespace norvex {
namespace {

TEST(StoredQueryThreads, TheWaitEndsWithTheWorkAndNotWithItsDeadline) {
  TestPlatform world(TestThreads::several);
  TestVolume volume;
  ASSERT_TRUE(volume.update().ok());
  addStoredItems(volume, 10, 3 * 5000);
  VolumeStores stores(volume.stores());
  StoredMetadataIndex index(stores, world.threadedEventLoops);

  std::thread::id handledOn;
  std::size_t handled = 0;  // touched on the main thread while the worker waits, read after it has ended
  std::atomic<bool> done{false};
  EventLoop& mainLoop = world.threadedEventLoops.main();
  std::thread worker([&] {
    EventLoop& loop = world.threadedEventLoops.current();
    for (int round = 0; round < 7; ++round) {
      const auto query = index.createQuery();
      query->setPredicate("kMDItemContentType == 'two'");
      query->setSearchScopes({Location::folder(volume.root())});
      const auto token = query->addFinishObserver([&](MetadataQuery& finished) {
        finished.stop();
        handledOn = std::this_thread::get_id();
        for (std::size_t i = 0; i < finished.resultCount(); ++i) {
          handled += finished.resultAtIndex(i)->valueForAttribute(kMDItemPath).has_value() ? 1 : 0;
        }
      });
      EXPECT_TRUE(query->start());
      // No deadline at all: a pass that waited for one would never end.
      while (!query->isStopped()) loop.runOnce(Clock::Moment::max());
      query->removeFinishObserver(token);
    }
    mainLoop.post([&] { done = true; });
  });
  while (!done) mainLoop.runOnce(Clock::Moment::max());
  worker.join();
  EXPECT_EQ(handled, 7U * 5000U);
  EXPECT_EQ(handledOn, std::this_thread::get_id());
}

}  // namespace
}  // namespace norvex
