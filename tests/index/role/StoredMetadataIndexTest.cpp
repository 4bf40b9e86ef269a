// Items by path and volume counts, over real stores.
#include "index/StoredMetadataIndex.h"

#include <gmock/gmock.h>

#include "TestVolume.h"
#include "tests/support/TestPlatform.h"

namespace norvex {
namespace {

struct Indexed {
  TestPlatform world;
  TestVolume volume;
  VolumeStores stores{volume.stores()};
  StoredMetadataIndex index{stores, world.eventLoops};
  StoredVolumeCatalog catalog{stores, world.volumeCatalog};
};

TEST(StoredMetadataIndex, TheRootCarriesTheStoresOwnAttributes) {
  Indexed indexed;
  indexed.volume.file("song.mp3", "12345");
  ASSERT_TRUE(indexed.volume.update().ok());
  const auto root = indexed.index.itemAtPath(indexed.volume.root());
  ASSERT_NE(root, nullptr);
  EXPECT_TRUE(root->valueForAttribute(kMDStoreLastHealthCheck).has_value());
  const auto sizes = root->valueForAttribute(kMDStoreAccumulatedSizes);
  ASSERT_TRUE(sizes.has_value());
  const auto& values = std::get<std::vector<std::int64_t>>(*sizes);
  ASSERT_EQ(values.size(), 18U);
  constexpr std::size_t kMusic = 9;
  EXPECT_EQ(values[kMusic], 5);
}

TEST(StoredMetadataIndex, OtherItemsDoNot) {
  Indexed indexed;
  indexed.volume.file("folder/song.mp3", "12345");
  ASSERT_TRUE(indexed.volume.update().ok());
  for (const char* path : {"folder", "folder/song.mp3"}) {
    const auto item = indexed.index.itemAtPath(indexed.volume.at(path));
    ASSERT_NE(item, nullptr) << path;
    EXPECT_FALSE(item->valueForAttribute(kMDStoreLastHealthCheck).has_value()) << path;
    EXPECT_EQ(std::get<std::string>(item->valueForAttribute(kMDItemPath).value()), indexed.volume.at(path));
  }
}

TEST(StoredMetadataIndex, HasNoItemForWhatIsNotThere) {
  Indexed indexed;
  ASSERT_TRUE(indexed.volume.update().ok());
  EXPECT_EQ(indexed.index.itemAtPath(indexed.volume.at("missing")), nullptr);
}

TEST(StoredMetadataIndex, HasNoItemWithoutAStore) {
  Indexed indexed;
  indexed.volume.file("a.jpg");
  EXPECT_EQ(indexed.index.itemAtPath(indexed.volume.root()), nullptr);
  EXPECT_EQ(indexed.index.itemAtPath(indexed.volume.at("a.jpg")), nullptr);
}

TEST(StoredMetadataIndex, AStoreBeforeItsFirstUpdateHasNoHealthCheck) {
  Indexed indexed;
  std::atomic<bool> cancelled{true};
  ASSERT_FALSE(
      updateIndex(indexed.volume.stores(), indexed.volume.root(), TestVolume::rules(), {}, cancelled).ok());
  const auto root = indexed.index.itemAtPath(indexed.volume.root());
  ASSERT_NE(root, nullptr);
  EXPECT_FALSE(root->valueForAttribute(kMDStoreLastHealthCheck).has_value());
}

TEST(StoredMetadataIndex, AMountPointIsAnsweredByItsOwnStoreOnly) {
  TestPlatform world;
  TestVolume volume;
  volume.file("mounted/inside.jpg");
  ASSERT_TRUE(volume.update().ok());
  const std::string mounted = volume.at("mounted");
  VolumeStores stores(volume.stores(), [&](const std::string& path) { return path == mounted; });
  StoredMetadataIndex index(stores, world.eventLoops);
  EXPECT_EQ(index.itemAtPath(mounted), nullptr);
  EXPECT_EQ(index.itemAtPath(mounted + "/inside.jpg"), nullptr);
  EXPECT_NE(index.itemAtPath(volume.root()), nullptr);
}

TEST(StoredVolumeCatalog, CountsAreTheStoresOwn) {
  Indexed indexed;
  indexed.volume.file("folder/a");
  indexed.volume.file("folder/b");
  indexed.volume.link("link", "folder");
  ASSERT_TRUE(indexed.volume.update().ok());
  indexed.world.volumeCatalog.countsOfVolume[indexed.volume.at("folder")] = {};  // it is there
  FileReference file;
  VolumeReference root;
  VolumeObjectCounts counts;
  ASSERT_EQ(indexed.catalog.makeReference(indexed.volume.at("folder"), file), 0);
  ASSERT_EQ(indexed.catalog.volumeOf(file, root), 0);
  ASSERT_EQ(indexed.catalog.objectCounts(root, counts), 0);
  EXPECT_EQ(counts.files, 3U);
  EXPECT_EQ(counts.folders, 1U);
}

TEST(StoredVolumeCatalog, AVolumeWithoutAStoreIsCountedByTheFallback) {
  Indexed indexed;
  const std::string folder = indexed.volume.root();
  // As the nearest folder upwards at which something is mounted, the volume is not the folder itself.
  indexed.world.volumeCatalog.countsOfVolume[folder] = {};
  FileReference file;
  VolumeReference root;
  ASSERT_EQ(indexed.catalog.makeReference(folder, file), 0);
  ASSERT_EQ(indexed.catalog.volumeOf(file, root), 0);
  indexed.world.volumeCatalog.countsOfVolume[root.root] = {.files = 7, .folders = 0};
  VolumeObjectCounts counts;
  ASSERT_EQ(indexed.catalog.objectCounts(root, counts), 0);
  EXPECT_EQ(counts.files, 7U);
}

TEST(StoredVolumeCatalog, WhatIsNotThereHasNoReference) {
  Indexed indexed;
  FileReference file;
  EXPECT_NE(indexed.catalog.makeReference("/nonexistent", file), 0);
}

}  // namespace
}  // namespace norvex
