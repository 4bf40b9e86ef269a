// Queries over real stores, on one thread.
#include "index/StoredQuery.h"

#include <gmock/gmock.h>

#include <algorithm>
#include <functional>

#include "QueriedVolume.h"
#include "StoredItems.h"

namespace norvex {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;

TEST(StoredQuery, FindsNothingOnAVolumeWithoutAStore) {
  QueriedVolume queried;
  queried.volume.file("a.jpg", "x");
  EXPECT_THAT(queried.search("kMDItemContentTypeTree == 'public.image'"), IsEmpty());
}

TEST(StoredQuery, FindsNothingWhileTheFirstUpdateIsUnderWay) {
  QueriedVolume queried;
  queried.volume.file("a.jpg", "x");
  std::atomic<bool> cancelled{true};
  ASSERT_FALSE(
      updateIndex(queried.volume.stores(), queried.volume.root(), TestVolume::rules(), {}, cancelled).ok());
  EXPECT_THAT(queried.search("kMDItemContentTypeTree == 'public.image'"), IsEmpty());
}

TEST(StoredQuery, EachOfTheScansPredicatesFindsItsItems) {
  QueriedVolume queried;
  const TestVolume& volume = queried.volume;
  volume.file("music/song.mp3", "12345");
  volume.file("music/store.m4a", "1");
  volume.file("pictures/photo.jpg", "1");
  volume.file("pictures/not-a-photo.txt", "1");
  volume.file("videos/film.mkv", "1");
  volume.file("phone/app.ipa", "1");
  volume.file("machines/disk.qcow2", "1");
  volume.file("machines/linux.vmwarevm/disk", "1");
  volume.file("machines/other.pvm/disk", "1");
  volume.file("Bought.app/Contents/_DovecartReceipt/receipt", "1");
  volume.file("cache/CACHEDIR.TAG", "Signature: 8a477f597d28d172789f06886806bc55\n");
  ASSERT_TRUE(volume.update().ok());

  const std::vector<std::pair<const char*, std::vector<std::string>>> rows = {
      {"com_brixo_backup_excludeItem == 'com.brixo.backupd'", {"/cache"}},
      {"kMDItemDovecartHasReceipt=1", {"/Bought.app"}},
      {"kMDItemContentTypeTree == 'public.image'", {"/pictures/photo.jpg"}},
      {"kMDItemContentTypeTree == 'public.audio'", {"/music/song.mp3", "/music/store.m4a"}},
      {"kMDItemContentTypeTree == 'public.movie' || kMDItemContentTypeTree == 'public.video'",
       {"/videos/film.mkv"}},
      {"kMDItemContentType == 'com.brixo.sonpix.ipa'", {"/phone/app.ipa"}},
      {"kMDItemContentType == 'com.vmware.vm-package' || kMDItemContentType == 'com.parallels.vm.vmpackage' "
       "|| "
       "kMDItemKind == 'Virtual Disk Image'",
       {"/machines/disk.qcow2", "/machines/linux.vmwarevm", "/machines/other.pvm"}},
  };
  for (const auto& [predicate, expected] : rows) EXPECT_EQ(queried.search(predicate), expected) << predicate;
}

TEST(StoredQuery, AScopeIsTheSameVolumeHoweverItsPathIsWritten) {
  QueriedVolume queried;
  queried.volume.file("a.png");
  ASSERT_TRUE(queried.volume.update().ok());
  for (const char* ending : {"", "/", "/.", "//"}) {
    const auto query = makeStoredQuery(queried.stores, queried.world.eventLoops);
    query->setPredicate("kMDItemFSName == 'a.png'");
    query->setSearchScopes({Location::folder(queried.volume.root() + ending)});
    const auto token = query->addFinishObserver([](MetadataQuery& finished) { finished.stop(); });
    ASSERT_TRUE(query->start());
    turnUntilStopped(queried.world, *query);
    query->removeFinishObserver(token);
    EXPECT_EQ(query->resultCount(), 1U) << ending;
  }
}

TEST(StoredQuery, KeepsTheOrderWhileOtherInputsHaveTheirTurnsBetweenItsPieces) {
  QueriedVolume queried;
  ASSERT_TRUE(queried.volume.update().ok());
  addStoredItems(queried.volume, 10, 50'000);
  EventLoop& loop = queried.world.eventLoops.loop;
  for (const char* predicate : {"kMDItemContentTypeTree == 'odd'", "kMDItemFSName != 'f10'"}) {
    int turns = 0;
    bool isSearched = false;
    std::function<void()> otherInput = [&] {
      ++turns;
      if (!isSearched) loop.post(otherInput);
    };
    loop.post(otherInput);
    const auto found = queried.search(predicate);
    isSearched = true;
    loop.runOnce(queried.world.clock.now());  // the last of the other inputs
    EXPECT_GE(turns, 3) << predicate;
    EXPECT_GT(found.size(), 30'000U) << predicate;
    // "" is the volume's root, which the second predicate finds first.
    const auto numberOf = [](const std::string& path) {
      return path.empty() ? 1 : std::stol(path.substr(2));
    };
    EXPECT_TRUE(std::ranges::is_sorted(found, std::ranges::less(), numberOf)) << predicate;
  }
}

TEST(StoredQuery, DoesNotStartWithWhatIsNoPredicate) {
  QueriedVolume queried;
  ASSERT_TRUE(queried.volume.update().ok());
  for (const char* predicate : {"", "kMDItemKind = ", "((", "kMDItemFSSize == 'x"}) {
    EXPECT_THAT(queried.search(predicate), ElementsAre("did not start")) << predicate;
  }
}

TEST(StoredQuery, DoesNotStartOverADamagedOrNewerStore) {
  for (const char* damage : {"damaged", "newer"}) {
    QueriedVolume queried;
    queried.volume.file("a.jpg");
    ASSERT_TRUE(queried.volume.update().ok());
    if (damage == std::string("damaged")) {
      ASSERT_EQ(truncate(queried.volume.storePath().c_str(), 5000), 0);
    } else {
      queried.volume.tamper("PRAGMA user_version = 1000000");
    }
    EXPECT_THAT(queried.search("kMDItemContentTypeTree == 'public.image'"), ElementsAre("did not start"))
        << damage;
  }
}

TEST(StoredQuery, SeesTheStoreThatWasThereAtFirst) {
  QueriedVolume queried;
  queried.volume.file("a.jpg");
  ASSERT_TRUE(queried.volume.update().ok());
  EXPECT_THAT(queried.search("kMDItemFSName == '*.jpg'"), ElementsAre("/a.jpg"));
  queried.volume.file("b.jpg");
  ASSERT_TRUE(queried.volume.update().ok());
  EXPECT_THAT(queried.search("kMDItemFSName == '*.jpg'"), ElementsAre("/a.jpg"));
}

TEST(StoredQuery, TellsNoObserverOfAQueryThatIsGone) {
  QueriedVolume queried;
  ASSERT_TRUE(queried.volume.update().ok());
  int told = 0;
  {
    const auto query = makeStoredQuery(queried.stores, queried.world.eventLoops);
    query->setPredicate("kMDItemFSName == '*'");
    query->setSearchScopes({Location::folder(queried.volume.root())});
    const auto token = query->addFinishObserver([&](MetadataQuery&) { ++told; });
    ASSERT_TRUE(query->start());
    query->removeFinishObserver(token);
  }
  queried.world.eventLoops.loop.runOnce(queried.world.clock.now());  // the batch that was queued at the start
  EXPECT_EQ(told, 0);
}

TEST(StoredQuery, StopBeforeStartIsHarmless) {
  QueriedVolume queried;
  const auto query = makeStoredQuery(queried.stores, queried.world.eventLoops);
  query->stop();
  EXPECT_TRUE(query->isStopped());
  EXPECT_EQ(query->resultCount(), 0U);
}

}  // namespace
}  // namespace norvex
