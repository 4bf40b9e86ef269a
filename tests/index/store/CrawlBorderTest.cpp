// Borders between volumes, with file systems that are mounted in a child's own view.
#include <gtest/gtest.h>
#include <sys/mount.h>
#include <sys/wait.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <string>

#include "TestVolume.h"

namespace norvex {
namespace {

constexpr int kMayNotMount = 77;

bool mountTmpfs(const std::string& path, const char* options) {
  return ::mount("tmpfs", path.c_str(), "tmpfs", 0, options) == 0;
}

bool bindMount(const std::string& from, const std::string& to) {
  return ::mount(from.c_str(), to.c_str(), nullptr, MS_BIND, nullptr) == 0;
}

// Each gives 0 when what it says is so.
int crawlStopsAtMounts(const TestVolume& volume) {
  if (!mountTmpfs(volume.at("other"), "size=1m") || !bindMount(volume.at("own"), volume.at("bound")))
    return kMayNotMount;
  std::ofstream(volume.at("other/inside")) << "x";
  const auto summary = volume.update();
  if (!summary) return 2;
  if (summary.value().figures.files != 1 || summary.value().figures.folders != 3) return 3;
  return volume.paths() == std::vector<std::string>{"bound", "other", "own", "own/file"} ? 0 : 4;
}

int storeIsOfTheFileSystemThatWasIndexed(const TestVolume& volume) {
  if (!mountTmpfs(volume.root(), "size=1m")) return kMayNotMount;
  if (!volume.update() || !volume.open()) return 2;
  if (::umount(volume.root().c_str()) != 0) return 3;
  const auto reader = volume.open();
  return !reader && reader.error().code == kStoreMissing ? 0 : 4;
}

int fullDiskKeepsTheOldStore(const TestVolume& volume) {
  const std::string cache = volume.root() + "/../small";
  std::filesystem::create_directories(cache);
  if (!mountTmpfs(cache, "size=300k")) return kMayNotMount;
  const StoreFolder stores(cache);
  const std::atomic<bool> cancelled{false};
  if (!updateIndex(stores, volume.root(), TestVolume::rules(), {}, cancelled)) return 2;
  for (int number = 0; number < 9000; ++number) volume.file("many/" + std::to_string(number));
  const auto summary = updateIndex(stores, volume.root(), TestVolume::rules(), {}, cancelled);
  if (summary || summary.error().code != ENOSPC) return 3;
  if (std::filesystem::exists(stores.unfinishedPath(volume.root()))) return 4;
  const auto reader = StoreReader::open(stores, volume.root());
  return reader && reader.value()->counts()->files == 1 ? 0 : 5;
}

struct Case {
  const char* name;
  int (*holds)(const TestVolume&);
};

class CrawlBorder : public testing::TestWithParam<Case> {};

TEST_P(CrawlBorder, Holds) {
  TestVolume volume;
  volume.file("own/file");
  volume.folder("other");
  volume.folder("bound");
  const ChildEnd end = inChild([&] { return enterOwnMounts() ? GetParam().holds(volume) : kMayNotMount; });
  ASSERT_TRUE(WIFEXITED(end.status));
  if (WEXITSTATUS(end.status) == kMayNotMount)
    GTEST_SKIP() << "nothing can be mounted here, not even in a view of one's own";
  EXPECT_EQ(WEXITSTATUS(end.status), 0);
}

INSTANTIATE_TEST_SUITE_P(Mounts, CrawlBorder,
                         testing::Values(Case{"CrawlStopsAtMounts", crawlStopsAtMounts},
                                         Case{"StoreIsOfTheFileSystemThatWasIndexed",
                                              storeIsOfTheFileSystemThatWasIndexed},
                                         Case{"FullDiskKeepsTheOldStore", fullDiskKeepsTheOldStore}),
                         [](const auto& test) { return std::string(test.param.name); });

}  // namespace
}  // namespace norvex
