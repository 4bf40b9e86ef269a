#include "index/StoreReader.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <vector>

#include "TestVolume.h"

namespace norvex {
namespace {

using testing::ElementsAre;

TEST(StoreReader, HasNoStoreOfAVolumeThatWasNeverIndexed) {
  TestVolume volume;
  const auto reader = volume.open();
  ASSERT_FALSE(reader.ok());
  EXPECT_EQ(reader.error().code, kStoreMissing);
}

TEST(StoreReader, FindsItemsByPathAndNothingElse) {
  TestVolume volume;
  volume.file("a/b/c");
  volume.file("a/b.txt");
  ASSERT_TRUE(volume.update().ok());
  const auto reader = volume.open();
  ASSERT_TRUE(reader.ok());
  for (const char* path : {"", "a", "a/b", "a/b/", "a//b/c", "a/b.txt"}) {
    EXPECT_TRUE(reader.value()->itemAt(path).value()) << path;
  }
  for (const char* path : {"b", "a/c", "a/b/c/d", "a/b.tx", "a/..", "A"}) {
    EXPECT_FALSE(reader.value()->itemAt(path).value()) << path;
  }
}

TEST(StoreReader, GivesTheRootTheVolumesFigures) {
  TestVolume volume;
  volume.file("file.png", "12345");
  ASSERT_TRUE(volume.update().ok());
  const auto reader = volume.open();
  ASSERT_TRUE(reader.ok());
  const auto check = reader.value()->attribute(kRootItem, kMDStoreLastHealthCheck).value();
  ASSERT_TRUE(check);
  EXPECT_EQ(std::get<MetadataDate>(*check).secondsSince1970,
            static_cast<double>(*reader.value()->healthCheck()));
  const auto sizes = reader.value()->attribute(kRootItem, kMDStoreAccumulatedSizes).value();
  ASSERT_TRUE(sizes);
  EXPECT_EQ(std::get<std::vector<std::int64_t>>(*sizes).size(), 18U);
  EXPECT_EQ(told(reader.value()->attribute(kRootItem, kMDItemPath).value()), told(volume.root()));
  EXPECT_EQ(told(reader.value()->attribute(kRootItem, "kMDItemFSName").value()), told(std::string("volume")));
  EXPECT_FALSE(reader.value()->attribute(kRootItem, "kMDItemFSSize").value());
  const std::int64_t file = *reader.value()->itemAt("file.png").value();
  EXPECT_FALSE(reader.value()->attribute(file, kMDStoreLastHealthCheck).value());
}

TEST(StoreReader, TellsTypesAndTheirTree) {
  TestVolume volume;
  volume.file("picture.png");
  ASSERT_TRUE(volume.update().ok());
  const auto reader = volume.open();
  ASSERT_TRUE(reader.ok());
  const std::int64_t file = *reader.value()->itemAt("picture.png").value();
  EXPECT_EQ(told(reader.value()->attribute(file, "kMDItemContentType").value()),
            told(std::string("public.png")));
  const auto tree = reader.value()->attribute(file, "kMDItemContentTypeTree").value();
  ASSERT_TRUE(tree);
  EXPECT_THAT(std::get<std::vector<std::string>>(*tree),
              testing::IsSupersetOf({"public.png", "public.image", "public.item"}));
}

TEST(StoreReader, AnswersQueriesOverTypesByTheIndex) {
  TestVolume volume;
  volume.file("a.png");
  volume.file("b/c.jpg");
  volume.file("b/d.txt");
  ASSERT_TRUE(volume.update().ok());
  const auto reader = volume.open();
  ASSERT_TRUE(reader.ok());
  const std::string query =
      "SELECT path_of(i.id) FROM items AS i WHERE i.type IN (SELECT type FROM type_tree WHERE "
      "ancestor='public.image') "
      "ORDER BY i.id";
  auto statement = reader.value()->prepare(query);
  ASSERT_TRUE(statement.ok());
  std::vector<std::string> found;
  while (sqlite3_step(statement.value().get()) == SQLITE_ROW)
    found.emplace_back(storeBytes(statement.value().get(), 0));
  EXPECT_THAT(found, ElementsAre(volume.at("a.png"), volume.at("b/c.jpg")));
  auto plan = reader.value()->prepare("EXPLAIN QUERY PLAN " + query);
  ASSERT_TRUE(plan.ok());
  ASSERT_EQ(sqlite3_step(plan.value().get()), SQLITE_ROW);
  EXPECT_THAT(std::string(storeBytes(plan.value().get(), 3)), testing::HasSubstr("items_by_type"));
}

TEST(StoreReader, ListsWhatAnItemCarries) {
  TestVolume volume;
  volume.file("file");
  if (!volume.attribute("file", "user.kMDItemB", "2") || !volume.attribute("file", "user.kMDItemA", "x")) {
    GTEST_SKIP() << "the file system under the tests has no extended attributes";
  }
  ASSERT_TRUE(volume.update().ok());
  const auto reader = volume.open();
  ASSERT_TRUE(reader.ok());
  const std::int64_t file = *reader.value()->itemAt("file").value();
  EXPECT_THAT(reader.value()->carriedAttributes(file).value(), ElementsAre("kMDItemA", "kMDItemB"));
}

TEST(StoreFolder, GivesEveryVolumeAFileOfItsOwn) {
  const StoreFolder folder("/cache");
  const std::vector<std::string> roots = {"/",
                                          "/a",
                                          "/a/b",
                                          "/a%2Fb",
                                          "/a_b",
                                          "/A",
                                          "/" + std::string(300, 'x') + "1",
                                          "/" + std::string(300, 'x') + "2",
                                          "/\xff"};
  std::vector<std::string> paths;
  for (const std::string& root : roots) {
    paths.push_back(folder.lockPath(root));
    EXPECT_LE(paths.back().substr(paths.back().rfind('/') + 1).size(), 255U);
  }
  std::sort(paths.begin(), paths.end());
  EXPECT_EQ(std::adjacent_find(paths.begin(), paths.end()), paths.end());
}

}  // namespace
}  // namespace norvex
