#include "index/FinishObservers.h"

#include <gmock/gmock.h>

#include <atomic>
#include <future>
#include <thread>

#include "index/StoredQuery.h"
#include "tests/support/TestPlatform.h"

namespace norvex {
namespace {

using ::testing::ElementsAre;

// Any query will do: observers are handed it and nothing more.
struct Fixture {
  TestPlatform world;
  VolumeStores stores{StoreFolder("/nonexistent")};
  std::unique_ptr<MetadataQuery> query = makeStoredQuery(stores, world.eventLoops);
  FinishObservers observers;
};

TEST(FinishObservers, AreToldOnceInTheOrderTheyCame) {
  Fixture fixture;
  std::vector<int> told;
  const auto first = fixture.observers.add([&](MetadataQuery&) { told.push_back(1); });
  const auto second = fixture.observers.add([&](MetadataQuery&) { told.push_back(2); });
  EXPECT_NE(first, second);
  fixture.observers.notify(*fixture.query);
  fixture.observers.notify(*fixture.query);
  EXPECT_THAT(told, ElementsAre(1, 2));
}

TEST(FinishObservers, AreHandedTheQuery) {
  Fixture fixture;
  MetadataQuery* handed = nullptr;
  fixture.observers.add([&](MetadataQuery& query) { handed = &query; });
  fixture.observers.notify(*fixture.query);
  EXPECT_EQ(handed, fixture.query.get());
}

TEST(FinishObservers, AreNotToldOnceRemoved) {
  Fixture fixture;
  std::vector<int> told;
  const auto first = fixture.observers.add([&](MetadataQuery&) { told.push_back(1); });
  fixture.observers.add([&](MetadataQuery&) { told.push_back(2); });
  fixture.observers.remove(first);
  fixture.observers.remove(first);
  fixture.observers.remove(12345);
  fixture.observers.notify(*fixture.query);
  EXPECT_THAT(told, ElementsAre(2));
}

TEST(FinishObservers, MayRemoveThemselvesAndEachOther) {
  Fixture fixture;
  std::vector<int> told;
  MetadataQuery::ObserverToken first = 0;
  MetadataQuery::ObserverToken second = 0;
  first = fixture.observers.add([&](MetadataQuery&) {
    told.push_back(1);
    fixture.observers.remove(first);
    fixture.observers.remove(second);
  });
  second = fixture.observers.add([&](MetadataQuery&) { told.push_back(2); });
  fixture.observers.notify(*fixture.query);
  EXPECT_THAT(told, ElementsAre(1));
}

TEST(FinishObservers, ThatComeMeanwhileAreToldToo) {
  Fixture fixture;
  std::vector<int> told;
  fixture.observers.add([&](MetadataQuery&) {
    told.push_back(1);
    fixture.observers.add([&](MetadataQuery&) { told.push_back(2); });
  });
  fixture.observers.notify(*fixture.query);
  EXPECT_THAT(told, ElementsAre(1, 2));
}

TEST(FinishObserversThreads, RemovalWaitsForACallOnAnotherThread) {
  Fixture fixture;
  std::promise<void> called;
  std::atomic<bool> removing{false};
  int written = 0;  // no lock: the removal is what makes it visible, which the thread sanitizer watches
  const auto token = fixture.observers.add([&](MetadataQuery&) {
    called.set_value();
    while (!removing) std::this_thread::yield();
    for (int step = 0; step < 1000; ++step) ++written;
  });
  std::thread notifier([&] { fixture.observers.notify(*fixture.query); });
  called.get_future().wait();
  removing = true;
  fixture.observers.remove(token);
  EXPECT_EQ(written, 1000);
  notifier.join();
}

TEST(FinishObserversThreads, AreToldOnceOrNeverWhenRemovalAndNotificationMeet) {
  for (int round = 0; round < 200; ++round) {
    Fixture fixture;
    int told = 0;
    const auto token = fixture.observers.add([&](MetadataQuery&) { ++told; });
    std::thread notifier([&] { fixture.observers.notify(*fixture.query); });
    fixture.observers.remove(token);
    const int toldAtRemoval = told;
    notifier.join();
    EXPECT_EQ(told, toldAtRemoval);
    EXPECT_LE(told, 1);
  }
}

}  // namespace
}  // namespace norvex
