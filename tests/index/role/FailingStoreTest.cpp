// Stores whose bytes change after they were opened and found good: what is asked of them comes to an end,
// with what could be read.
#include <fcntl.h>
#include <gmock/gmock.h>
#include <unistd.h>

#include <filesystem>

#include "QueriedVolume.h"
#include "StoredItems.h"
#include "index/StoredMetadataIndex.h"
#include "platform/Result.h"

namespace norvex {
namespace {

using ::testing::ElementsAre;

constexpr std::int64_t kItems = 40'000;
constexpr off_t kPageBytes = 4096;

// Writes `bytes` over a page of the store's file, which is already open elsewhere.
void overwritePage(const TestVolume& volume, off_t page, const std::string& bytes) {
  const FileDescriptor file(::open(volume.storePath().c_str(), O_WRONLY | O_CLOEXEC));
  ASSERT_EQ(::pwrite(file.number(), bytes.data(), bytes.size(), page * kPageBytes),
            static_cast<ssize_t>(bytes.size()));
}

off_t pagesOf(const TestVolume& volume) {
  return static_cast<off_t>(std::filesystem::file_size(volume.storePath())) / kPageBytes;
}

void overwriteAllButTheFirst(const TestVolume& volume) {
  const off_t pages = pagesOf(volume);
  for (off_t page = 1; page < pages; ++page) overwritePage(volume, page, std::string(kPageBytes, '\xff'));
}

struct OpenedVolume : QueriedVolume {
  StoredMetadataIndex index{stores, world.eventLoops};

  OpenedVolume() {
    volume.file("folder/file.jpg", "12345");
    EXPECT_TRUE(volume.update().ok());
    addStoredItems(volume, 10, kItems);
    EXPECT_TRUE(stores.storeOf(volume.root()).ok());
  }
};

TEST(FailingStore, EndsAQueryWithWhatItHasFoundAndLetsNoOtherStart) {
  OpenedVolume opened;
  overwriteAllButTheFirst(opened.volume);
  EXPECT_LT(opened.search("kMDItemFSName != 'none'").size(), static_cast<std::size_t>(kItems));
  EXPECT_THAT(opened.search("kMDItemContentTypeTree == 'odd'"), ElementsAre("did not start"));
}

TEST(FailingStore, EndsAQueryThatIsUnderWay) {
  OpenedVolume opened;
  const auto query = opened.index.createQuery();
  query->setPredicate("kMDItemFSName != 'none'");
  query->setSearchScopes({Location::folder(opened.volume.root())});
  std::size_t found = 0;
  const auto token = query->addFinishObserver([&](MetadataQuery& finished) {
    finished.stop();
    found = finished.resultCount();
    // Each is made and read, whether it still can be or not.
    for (std::size_t i = 0; i < found; ++i) finished.resultAtIndex(i)->valueForAttribute(kMDItemPath);
  });
  ASSERT_TRUE(query->start());
  opened.world.eventLoops.loop.runOnce(opened.world.clock.now());  // the first piece
  overwriteAllButTheFirst(opened.volume);
  turnUntilStopped(opened.world, *query);
  query->removeFinishObserver(token);
  EXPECT_TRUE(query->isStopped());
  EXPECT_GT(found, 0U);
  EXPECT_LT(found, static_cast<std::size_t>(kItems));
}

// A page that still looks like one: whatever its bytes now say, everything ends, and no match is made up.
TEST(FailingStore, EndsEveryQueryWhicheverPageIsAnother) {
  constexpr off_t kSteps = 8;
  for (off_t step = 1; step < kSteps; ++step) {
    OpenedVolume opened;
    const off_t page = pagesOf(opened.volume) * step / kSteps;
    std::string other(kPageBytes, '\0');
    const FileDescriptor file(::open(opened.volume.storePath().c_str(), O_RDONLY | O_CLOEXEC));
    ASSERT_EQ(::pread(file.number(), other.data(), other.size(), (page - 1) * kPageBytes), kPageBytes);
    overwritePage(opened.volume, page, other);
    for (const char* predicate : {"kMDItemContentTypeTree == 'odd'", "kMDItemPath == '*/f77'", "none == 1"}) {
      EXPECT_LE(opened.search(predicate).size(), static_cast<std::size_t>(kItems)) << page << predicate;
    }
    for (const char* path : {"", "folder", "folder/file.jpg", "f5000", "f37777", "none"}) {
      const auto item = opened.index.itemAtPath(opened.volume.at(path));
      if (item != nullptr) item->valueForAttribute("kMDItemContentTypeTree");
    }
  }
}

TEST(FailingStore, HasNoItemsAndNoValuesAnyMore) {
  OpenedVolume opened;
  const auto known = opened.index.itemAtPath(opened.volume.at("folder/file.jpg"));
  ASSERT_NE(known, nullptr);
  overwriteAllButTheFirst(opened.volume);
  // What the store's cache still holds may be answered; no more than that was there.
  EXPECT_EQ(opened.index.itemAtPath(opened.volume.at("f37777")), nullptr);
  EXPECT_EQ(opened.index.itemAtPath(opened.volume.at("none")), nullptr);
  for (const char* attribute : {"kMDItemContentTypeTree", "kMDItemOther", "kMDItemFSSize"}) {
    const auto value = known->valueForAttribute(attribute);
    if (value && attribute == std::string("kMDItemFSSize")) {
      EXPECT_EQ(std::get<std::int64_t>(*value), 5);
    }
  }
}

TEST(FailingStore, ThatWasDamagedBeforeHasNoItems) {
  QueriedVolume queried;
  queried.volume.file("folder/file.jpg");
  ASSERT_TRUE(queried.volume.update().ok());
  overwritePage(queried.volume, 1, std::string(kPageBytes, '\xff'));
  StoredMetadataIndex index(queried.stores, queried.world.eventLoops);
  for (const char* path : {"", "folder", "folder/file.jpg", "none"}) {
    EXPECT_EQ(index.itemAtPath(queried.volume.at(path)), nullptr) << path;
  }
}

}  // namespace
}  // namespace norvex
