// Walks that are long enough for the second thread.
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <filesystem>
#include <thread>

#include "platform/linux/LinuxDirectoryEnumeration.h"
#include "tests/linux/walk/ChildProcess.h"
#include "tests/linux/walk/RecordedWalk.h"
#include "tests/support/TreeOnDisk.h"

namespace norvex {
namespace {

using ondisk::file;
using ondisk::folder;
using ondisk::Item;
using ondisk::Medium;
using ondisk::TreeOnDisk;

constexpr std::size_t kWidth = 200;
constexpr std::size_t kLarge = 2500;

// `kWidth` folders, each with a few files and folders of its own, one of them larger than what is read ahead.
std::vector<Item> broadTree() {
  std::vector<Item> large;
  for (std::size_t number = 0; number < kLarge; ++number) {
    large.push_back(file(std::to_string(number) + std::string(230, '-'), 1));
  }
  std::vector<Item> items = {folder("100-large", large)};
  for (std::size_t number = 0; number < kWidth; ++number) {
    const std::string name = std::to_string(number);
    items.push_back(folder(name, {file("a", number), file("b", 3), folder("empty"),
                                  folder("nested", {file("c", 5), folder("deeper", {file("d", 7)})})}));
  }
  return items;
}

// What the standard library finds, in the order in which a walk yields it: as lists of path components.
std::vector<std::string> everythingBelow(const std::string& root) {
  std::vector<std::filesystem::path> paths;
  for (const auto& entry : std::filesystem::recursive_directory_iterator(root)) {
    paths.push_back(entry.path().lexically_relative(root));
  }
  std::sort(paths.begin(), paths.end());
  std::vector<std::string> texts;
  for (const auto& path : paths) texts.push_back(path.string());
  return texts;
}

TEST(ReadAhead, YieldsWhatIsThereInOrder) {
  const TreeOnDisk tree(broadTree(), Medium::memory);
  const std::vector<std::string> expected = everythingBelow(tree.path());
  for (const bool packages : {false, true}) {
    const RecordedWalk record = walk(tree.location(), {.packages = packages});
    EXPECT_TRUE(record.paths == expected);
    EXPECT_EQ(record.totalSize, (kWidth - 1) * kWidth / 2 + kWidth * (3 + 5 + 7) + kLarge);
    EXPECT_TRUE(record.errors.empty());
  }
}

TEST(ReadAhead, EndsWithAWalkThatIsLeftEarly) {
  const TreeOnDisk tree(broadTree(), Medium::memory);
  LinuxDirectoryEnumeration enumeration;
  for (int items = 0; items < 4'500; items += 500) {
    const auto walking = enumeration.enumerator(tree.location(), {}, nullptr);
    for (int item = 0; item < items && walking->next() != nullptr; ++item) {
    }
  }
}

TEST(ReadAhead, SurvivesATreeThatVanishesUnderIt) {
  const TreeOnDisk tree(broadTree(), Medium::memory);
  std::thread deleting;
  RecordedWalk record = walk(tree.location(), {.afterItem = [&](const std::string&) {
                               if (!deleting.joinable()) deleting = std::thread([&] { tree.clear(); });
                             }});
  deleting.join();
  EXPECT_TRUE(record.errors.empty()) << record.errors.front();
  std::sort(record.paths.begin(), record.paths.end());
  EXPECT_EQ(std::adjacent_find(record.paths.begin(), record.paths.end()), record.paths.end());
}

TEST(ReadAhead, ToldErrorsKeepTheirPlaceInTheWalk) {
  std::vector<Item> items;
  std::vector<std::string> expected;
  for (int number = 1000; number < 1600; ++number) {
    const std::string name = std::to_string(number);
    items.push_back(folder(name, {file("x"), folder("y").withMode(number % 10 == 0 ? 0 : 0755)}));
    expected.push_back("item " + name);
    expected.push_back("item " + name + "/x");
    expected.push_back("item " + name + "/y");
    if (number % 10 == 0) expected.push_back("error " + name + "/y");
  }
  const TreeOnDisk tree(items, Medium::memory);
  asOrdinaryUser([&] {
    std::vector<std::string> events;
    walk(tree.location(), {.afterItem = [&](const std::string& path) { events.push_back("item " + path); },
                           .onError =
                               [&](const std::string& path) {
                                 events.push_back("error " + path);
                                 return true;
                               }});
    EXPECT_TRUE(events == expected);
  });
}

TEST(ReadAhead, GoesOnAloneWhereNoThreadCanBeMade) {
  const TreeOnDisk tree(broadTree(), Medium::memory);
  const std::size_t expected = everythingBelow(tree.path()).size();
  asOrdinaryUser([&] {
    const rlimit none = {0, 0};
    ASSERT_EQ(::setrlimit(RLIMIT_NPROC, &none), 0);
    EXPECT_ANY_THROW(std::thread([] {}).join());
    EXPECT_EQ(walk(tree.location()).paths.size(), expected);
  });
}

TEST(ReadAhead, LetsSeveralWalksGoOnAtOnce) {
  const TreeOnDisk tree(broadTree(), Medium::memory);
  const std::size_t expected = everythingBelow(tree.path()).size();
  std::atomic<int> whole = 0;
  std::vector<std::thread> walkers;
  for (int number = 0; number < 3; ++number) {
    walkers.emplace_back([&] { whole += walk(tree.location()).paths.size() == expected ? 1 : 0; });
  }
  for (std::thread& walker : walkers) walker.join();
  EXPECT_EQ(whole, 3);
}

}  // namespace
}  // namespace norvex
