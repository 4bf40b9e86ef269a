// Stores that are not what was written: each gives a clear error and no crash, and the next update makes it
// anew.
#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <string>

#include "TestVolume.h"

namespace norvex {
namespace {

// Looks at everything that a reader may be asked; the code of the first error, 0 for none.
int useStore(const TestVolume& volume) {
  auto opened = volume.open();
  if (!opened) return opened.error().code;
  StoreReader& reader = *opened.value();
  for (std::int64_t id = 1; id <= 5; ++id) {
    for (const char* name : {"kMDItemPath", "kMDItemFSSize", "kMDItemContentTypeTree", "kMDItemOther"}) {
      const auto value = reader.attribute(id, name);
      if (!value) return value.error().code;
    }
  }
  for (const char* path : {"a", "a/b", "a/b/c.png", "d"}) {
    const auto item = reader.itemAt(path);
    if (!item) return item.error().code;
  }
  auto statement = reader.prepare("SELECT path_of(id) FROM items WHERE type>=0");
  if (!statement) return statement.error().code;
  int status = SQLITE_ROW;
  while ((status = sqlite3_step(statement.value().get())) == SQLITE_ROW) continue;
  return status == SQLITE_DONE ? 0 : reader.lastError().code;
}

void fillVolume(const TestVolume& volume) {
  volume.file("a/b/c.png", "123");
  volume.file("d");
  ASSERT_TRUE(volume.update().ok());
  ASSERT_EQ(useStore(volume), 0);
}

void expectRepair(const TestVolume& volume) {
  const auto summary = volume.update();
  ASSERT_TRUE(summary.ok()) << summary.error().description;
  EXPECT_EQ(useStore(volume), 0);
}

TEST(DamagedStore, IsToldByEveryFlippedByte) {
  TestVolume volume;
  fillVolume(volume);
  const auto size = static_cast<off_t>(std::filesystem::file_size(volume.storePath()));
  const FileDescriptor file(::open(volume.storePath().c_str(), O_RDWR | O_CLOEXEC));
  for (off_t offset = 0; offset < size; offset += offset < 200 || offset > size - 100 ? 1 : 97) {
    char byte = 0;
    ASSERT_EQ(::pread(file.number(), &byte, 1, offset), 1);
    const char flipped = static_cast<char>(byte ^ 0x10);
    ASSERT_EQ(::pwrite(file.number(), &flipped, 1, offset), 1);
    const auto reader = volume.open();
    ASSERT_FALSE(reader.ok()) << offset;
    EXPECT_TRUE(reader.error().code == kStoreDamaged || reader.error().code == kStoreTooNew) << offset;
    ASSERT_EQ(::pwrite(file.number(), &byte, 1, offset), 1);
  }
  EXPECT_EQ(useStore(volume), 0);
}

TEST(DamagedStore, IsToldByEveryMissingEnd) {
  TestVolume volume;
  fillVolume(volume);
  for (auto size = std::filesystem::file_size(volume.storePath()); size > 0;
       size -= std::min<std::uintmax_t>(size, 1009)) {
    std::filesystem::resize_file(volume.storePath(), size - 1);
    const auto reader = volume.open();
    ASSERT_FALSE(reader.ok()) << size;
    EXPECT_EQ(reader.error().code, kStoreDamaged) << size;
  }
  expectRepair(volume);
}

TEST(DamagedStore, MayBeSomethingElseThanAFile) {
  TestVolume volume;
  fillVolume(volume);
  const std::string path = volume.storePath();
  for (const int kind : {S_IFIFO, S_IFSOCK, S_IFREG}) {
    std::filesystem::remove(path);
    ASSERT_EQ(::mknod(path.c_str(), static_cast<mode_t>(kind) | 0600, 0), 0);
    EXPECT_EQ(useStore(volume), kStoreDamaged) << kind;
    expectRepair(volume);
  }
  std::filesystem::remove(path);
  std::filesystem::create_symlink("/dev/zero", path);
  EXPECT_EQ(useStore(volume), kStoreDamaged);
  expectRepair(volume);
}

TEST(DamagedStore, OfALaterVersionSaysSo) {
  TestVolume volume;
  fillVolume(volume);
  volume.tamper("PRAGMA user_version=99");
  const auto reader = volume.open();
  ASSERT_FALSE(reader.ok());
  EXPECT_EQ(reader.error().code, kStoreTooNew);
  EXPECT_NE(reader.error().description.find("norvexctl index update"), std::string::npos);
  expectRepair(volume);
}

TEST(DamagedStore, OfAnOlderVersionHasNoHealthCheck) {
  TestVolume volume;
  fillVolume(volume);
  volume.tamper("PRAGMA user_version=0");
  const auto reader = volume.open();
  ASSERT_TRUE(reader.ok());
  EXPECT_FALSE(reader.value()->healthCheck());
  EXPECT_TRUE(reader.value()->itemAt("").value());
  EXPECT_FALSE(reader.value()->itemAt("a").value());
  EXPECT_EQ(told(reader.value()->attribute(kRootItem, kMDItemPath).value()), told(volume.root()));
  expectRepair(volume);
}

struct Hostile {
  const char* name;
  const char* sql;
};

class HostileStore : public testing::TestWithParam<Hostile> {};

TEST_P(HostileStore, IsToldAndRepaired) {
  TestVolume volume;
  fillVolume(volume);
  volume.tamper(GetParam().sql);
  EXPECT_EQ(useStore(volume), kStoreDamaged);
  expectRepair(volume);
}

INSTANTIATE_TEST_SUITE_P(
    Contents, HostileStore,
    testing::Values(
        Hostile{"ParentOfItself", "UPDATE items SET parent=id WHERE id=4"},
        Hostile{"LoopOfParents", "UPDATE items SET parent=4 WHERE id=2"},
        Hostile{"ParentThatIsNotThere", "UPDATE items SET parent=-1 WHERE id=4"},
        Hostile{"RootInAFolder", "UPDATE items SET parent=3 WHERE id=1"},
        Hostile{"NoRoot", "DELETE FROM items WHERE id=1"},
        Hostile{"NegativeSize", "UPDATE items SET size=-1 WHERE id=3"},
        Hostile{"NameWithASlash", "UPDATE items SET name=x'612F62' WHERE id=4"},
        Hostile{"NameWithANul", "UPDATE items SET name=x'610062' WHERE id=4"},
        Hostile{"NoName", "UPDATE items SET name=NULL WHERE id=4"},
        Hostile{"NameOfTheFolderAround", "UPDATE items SET name=x'2E2E' WHERE id=4"},
        Hostile{"NameWithoutEnd", "UPDATE items SET name=zeroblob(5000000) WHERE id=4"},
        Hostile{"TypeThatIsNotThere", "UPDATE items SET type=999999 WHERE id=4"},
        Hostile{"ChildrenWithoutEnd", "UPDATE folders SET child_count=9223372036854775807 WHERE item=1"},
        Hostile{"ChildrenBelowZero", "UPDATE folders SET child_count=-5 WHERE item=1"},
        Hostile{"ChildrenBeforeTheirFolder", "UPDATE folders SET first_child=1 WHERE item=2"},
        Hostile{"ChildrenOfAnother", "UPDATE folders SET first_child=3, child_count=1 WHERE item=2"},
        Hostile{"NoFacts", "DELETE FROM facts"},
        Hostile{"NegativeCount", "UPDATE facts SET value=-1 WHERE name='files'"},
        Hostile{"CountThatIsNoNumber", "UPDATE facts SET value='many' WHERE name='folders'"},
        Hostile{"TooFewSizes", "UPDATE facts SET value='1 2 3' WHERE name='accumulated_sizes'"},
        Hostile{"NegativeSizes",
                "UPDATE facts SET value=replace(value, '0 0', '-1 0') WHERE name='accumulated_sizes'"},
        Hostile{"CheckThatIsNoMoment", "UPDATE facts SET value='now' WHERE name='health_check'"},
        Hostile{"AnotherVolumesRoot", "UPDATE facts SET value='/other' WHERE name='root'"},
        Hostile{"ViewWithoutEnd",
                "DROP TABLE items; CREATE VIEW items AS WITH RECURSIVE n(id) AS (SELECT 1 UNION ALL SELECT "
                "id+1 FROM n) "
                "SELECT id, 1 AS parent, x'61' AS name, 0 AS type, 0 AS size, 0 AS mtime FROM n"},
        Hostile{"TriggerBesides", "CREATE TRIGGER t AFTER INSERT ON items BEGIN SELECT 1; END"},
        Hostile{"IndexBesides", "CREATE INDEX x ON items(abs(size))"},
        Hostile{"NoIndex", "DROP INDEX items_by_type"}),
    [](const auto& test) { return std::string(test.param.name); });

}  // namespace
}  // namespace norvex
