// Trees that are deeper than a path may be long, or than a process may have files open.
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/resource.h>

#include <algorithm>
#include <filesystem>

#include "platform/linux/LinuxDirectoryEnumeration.h"
#include "platform/linux/LinuxDirectoryListing.h"
#include "platform/linux/LinuxFileExistence.h"
#include "platform/linux/LinuxResourceValues.h"
#include "tests/support/TreeOnDisk.h"

namespace norvex {
namespace {

using ondisk::file;
using ondisk::folder;
using ondisk::Medium;
using ondisk::TreeOnDisk;
using testing::ElementsAre;
using testing::Optional;

// What a long walk comes to, without keeping its paths.
struct Totals {
  std::size_t items = 0;
  std::size_t errors = 0;
  std::uint64_t deepest = 0;
  std::uint64_t bytes = 0;
  std::size_t longestPath = 0;
};

Totals walkAll(const Location& root) {
  Totals totals;
  LinuxDirectoryEnumeration enumeration;
  const auto walking = enumeration.enumerator(root, {}, [&](const Location&, const Error&) {
    ++totals.errors;
    return true;
  });
  while (const Location* item = walking->next()) {
    ++totals.items;
    totals.bytes += item->facts()->totalFileSize;
    totals.deepest = std::max(totals.deepest, walking->level());
    totals.longestPath = std::max(totals.longestPath, item->path().size());
  }
  return totals;
}

// As many open files as this process may have while this lives.
class OpenFileLimit {
 public:
  explicit OpenFileLimit(rlim_t files) {
    ::getrlimit(RLIMIT_NOFILE, &previous_);
    rlimit lowered = previous_;
    lowered.rlim_cur = files;
    ::setrlimit(RLIMIT_NOFILE, &lowered);
  }
  ~OpenFileLimit() { ::setrlimit(RLIMIT_NOFILE, &previous_); }
  OpenFileLimit(const OpenFileLimit&) = delete;
  OpenFileLimit& operator=(const OpenFileLimit&) = delete;

 private:
  rlimit previous_;
};

TEST(DeepTrees, AreWalkedBeyondTheLongestPathOfTheKernel) {
  const TreeOnDisk tree({}, Medium::memory);
  const std::string deepest = tree.addChain(100, std::string(200, 'd'), {file("x", 7)});
  ASSERT_GT(deepest.size(), 20'000u);
  const Totals totals = walkAll(tree.location());
  EXPECT_EQ(totals.items, 201u);
  EXPECT_EQ(totals.bytes, 101u * 7);
  EXPECT_EQ(totals.deepest, 101u);
  EXPECT_EQ(totals.longestPath, deepest.size() + 2);
  EXPECT_EQ(totals.errors, 0u);
}

TEST(DeepTrees, AreWalkedFromARootBeyondTheLongestPath) {
  const TreeOnDisk tree({}, Medium::memory);
  const std::string deepest = tree.addChain(100, std::string(200, 'd'), {file("x", 7)});
  const std::string root = deepest.substr(0, deepest.size() - 10 * 201);
  EXPECT_EQ(walkAll(Location::folder(root)).items, 21u);
}

TEST(DeepTrees, HaveValuesNamesAndExistenceBeyondTheLongestPath) {
  const TreeOnDisk tree({}, Medium::memory);
  const std::string deepest = tree.addChain(100, std::string(200, 'd'), {file("x", 7)});
  LinuxResourceValues values;
  EXPECT_THAT(values.value(Location::file(deepest + "/x"), ResourceKey::TotalFileSize).value(), Optional(7u));
  EXPECT_THAT(values.value(Location::folder(deepest), ResourceKey::IsDirectory).value(), Optional(1u));
  EXPECT_EQ(values.value(Location::folder(deepest), ResourceKey::VolumeTotalCapacity).value(),
            values.value(tree.location(), ResourceKey::VolumeTotalCapacity).value());
  EXPECT_EQ(values.value(Location::file(deepest + "/y"), ResourceKey::IsDirectory).error().code, ENOENT);
  EXPECT_THAT(LinuxDirectoryListing().names(deepest), Optional(ElementsAre("x")));
  EXPECT_TRUE(LinuxFileExistence().exists(deepest + "/x"));
  EXPECT_FALSE(LinuxFileExistence().exists(deepest + "/y"));
  EXPECT_FALSE(LinuxFileExistence().exists(tree.path() + std::string(5000, 'n')));
}

TEST(DeepTrees, OfTenThousandFoldersNeedFewOpenFiles) {
  const TreeOnDisk tree({}, Medium::memory);
  tree.addChain(10'000, "d", {file("x", 1)});
  for (const rlim_t limit : {rlim_t{1024}, rlim_t{24}}) {
    SCOPED_TRACE(limit);
    const OpenFileLimit limited(limit);
    const Totals totals = walkAll(tree.location());
    EXPECT_EQ(totals.items, 20'001u);
    EXPECT_EQ(totals.deepest, 10'001u);
    EXPECT_EQ(totals.errors, 0u);
  }
}

TEST(DeepTrees, WithSeveralFoldersALevelNeedFewOpenFiles) {
  constexpr std::size_t kDepth = 3000;
  const TreeOnDisk tree({}, Medium::memory);
  // On the way back from the deepest folder, two more are entered at each level.
  tree.addChain(kDepth, "a", {folder("b", {file("x", 1)}), folder("c", {file("y", 2)})});
  for (const rlim_t limit : {rlim_t{1024}, rlim_t{24}}) {
    SCOPED_TRACE(limit);
    const OpenFileLimit limited(limit);
    const Totals totals = walkAll(tree.location());
    EXPECT_EQ(totals.items, kDepth + 4 * (kDepth + 1));
    EXPECT_EQ(totals.bytes, 3 * (kDepth + 1));
    EXPECT_EQ(totals.errors, 0u);
  }
}

TEST(DeepTrees, AreNotLeftForAFolderThatTookTheirPlace) {
  constexpr std::size_t kDepth = 400;
  const TreeOnDisk tree({}, Medium::memory);
  tree.addChain(kDepth, "a", {folder("b", {file("x", 1)})});
  LinuxDirectoryEnumeration enumeration;
  const auto walking =
      enumeration.enumerator(tree.location(), {}, [](const Location&, const Error&) { return true; });
  bool swapped = false;
  std::size_t strangers = 0;
  std::size_t items = 0;
  while (const Location* item = walking->next()) {
    ++items;
    if (walking->level() == kDepth + 1 && !swapped) {
      swapped = true;
      // The walk has closed the topmost folders on its way down.
      std::filesystem::rename(tree.path("a"), tree.path("moved"));
      tree.add(".", {folder("a", {folder("b", {file("stranger")})})});
    }
    if (item->path().ends_with("stranger")) ++strangers;
  }
  EXPECT_EQ(strangers, 0u);
  EXPECT_GT(items, kDepth);
}

}  // namespace
}  // namespace norvex
