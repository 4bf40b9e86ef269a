#include <fcntl.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

#include <atomic>
#include <string>
#include <thread>
#include <vector>

#include "TestVolume.h"
#include "platform/PackageNames.h"

namespace norvex {
namespace {

using testing::ElementsAre;

std::string valueAt(const TestVolume& volume, std::string_view path, std::string_view attribute) {
  auto reader = volume.open();
  EXPECT_TRUE(reader.ok());
  if (!reader) return {};
  const auto id = reader.value()->itemAt(path);
  EXPECT_TRUE(id.ok() && id.value()) << path;
  if (!id || !id.value()) return {};
  auto value = reader.value()->attribute(*id.value(), attribute);
  EXPECT_TRUE(value.ok());
  return value ? told(value.value()) : value.error().description;
}

TEST(Crawl, MeetsItemsFolderByFolderInByteOrderOfNames) {
  TestVolume volume;
  volume.file("b/two.txt");
  volume.file("b/one.txt");
  volume.file("b/deep/x");
  volume.file("a/y");
  volume.file("B");
  volume.file(".hidden");
  ASSERT_TRUE(volume.update().ok());
  EXPECT_THAT(volume.paths(),
              ElementsAre(".hidden", "B", "a", "b", "a/y", "b/deep", "b/one.txt", "b/two.txt", "b/deep/x"));
}

TEST(Crawl, CountsEveryNameAndNotTheRoot) {
  TestVolume volume;
  volume.file("folder/file", "12345");
  ASSERT_EQ(::link(volume.at("folder/file").c_str(), volume.at("second name").c_str()), 0);
  volume.link("link", "folder/file");
  ASSERT_EQ(::mkfifo(volume.at("pipe").c_str(), 0600), 0);
  const auto summary = volume.update();
  ASSERT_TRUE(summary.ok());
  EXPECT_EQ(summary.value().figures.files, 4U);
  EXPECT_EQ(summary.value().figures.folders, 1U);
  EXPECT_EQ(summary.value().figures.accumulatedSizes.values()[17], 10);
  EXPECT_EQ(summary.value().figures.problems.count, 0U);
}

TEST(Crawl, FollowsNoLinkAndEndsOnLoops) {
  TestVolume volume;
  volume.folder("a/b");
  volume.link("a/b/up", "../..");
  volume.link("self", "self");
  volume.link("out", "/");
  ASSERT_TRUE(volume.update().ok());
  EXPECT_THAT(volume.paths(), ElementsAre("a", "out", "self", "a/b", "a/b/up"));
}

TEST(Crawl, KeepsNamesOfAnyBytes) {
  TestVolume volume;
  const std::vector<std::string> names = {"\x01 control", "\xff\xfe not UTF-8", "line\nfeed", "quote'\"%_*",
                                          std::string(255, 'n')};
  for (const std::string& name : names) volume.file(name, "x");
  ASSERT_TRUE(volume.update().ok());
  for (const std::string& name : names) {
    EXPECT_EQ(valueAt(volume, name, "kMDItemFSName"), told(name));
    EXPECT_EQ(valueAt(volume, name, kMDItemPath), told(volume.at(name)));
    EXPECT_EQ(valueAt(volume, name, "kMDItemFSSize"), told(std::int64_t{1}));
  }
}

TEST(Crawl, ReachesPathsOfTwentyThousandBytes) {
  TestVolume volume;
  const std::string name(200, 'd');
  std::string path;
  FileDescriptor folder(::open(volume.root().c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
  for (int depth = 0; depth < 100; ++depth) {
    ASSERT_EQ(::mkdirat(folder.number(), name.c_str(), 0700), 0);
    folder = FileDescriptor(::openat(folder.number(), name.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    path += name + "/";
  }
  ASSERT_TRUE(FileDescriptor(::openat(folder.number(), "end.png", O_WRONLY | O_CREAT | O_CLOEXEC, 0600)));
  const auto summary = volume.update();
  ASSERT_TRUE(summary.ok());
  EXPECT_EQ(summary.value().figures.folders, 100U);
  EXPECT_EQ(summary.value().figures.problems.count, 0U);
  EXPECT_EQ(valueAt(volume, path + "end.png", kMDItemPath), told(volume.at(path + "end.png")));
}

TEST(Crawl, ReadsFoldersThatAreTooLargeToBeReadAtOnce) {
  TestVolume volume;
  for (int number = 0; number < 3000; ++number) volume.file("large/file number " + std::to_string(number));
  for (int number = 0; number < 100; ++number)
    volume.file("large/folder " + std::to_string(number) + "/inside");
  const auto summary = volume.update();
  ASSERT_TRUE(summary.ok());
  EXPECT_EQ(summary.value().figures.files, 3100U);
  EXPECT_EQ(summary.value().figures.folders, 101U);
  auto reader = volume.open();
  ASSERT_TRUE(reader.ok());
  for (const char* path : {"large/file number 0", "large/file number 2999", "large/folder 99/inside"}) {
    const auto id = reader.value()->itemAt(path);
    ASSERT_TRUE(id.ok() && id.value()) << path;
    EXPECT_EQ(reader.value()->pathOf(*id.value()).value(), volume.at(path));
  }
  EXPECT_FALSE(reader.value()->itemAt("large/file number 3000").value());
}

TEST(Crawl, MakesTheSameStoreOfTheSameTree) {
  TestVolume volume;
  for (int number = 0; number < 300; ++number) {
    volume.file("f" + std::to_string(number % 40) + "/g" + std::to_string(number % 7) + "/" +
                std::to_string(number));
  }
  ASSERT_TRUE(volume.update().ok());
  const std::vector<std::string> first = volume.paths();
  ASSERT_TRUE(volume.update().ok());
  EXPECT_EQ(volume.paths(), first);
  EXPECT_EQ(first.size(), 300U + 40U + 280U);
}

TEST(Crawl, LeavesOutTheIndexesOwnCacheFolder) {
  TestVolume volume;
  const StoreFolder inside(volume.at("cache/norvex"));
  volume.file("cache/norvex/old store");
  volume.file("cache/other");
  const std::atomic<bool> cancelled{false};
  const auto summary = updateIndex(inside, volume.root(), TestVolume::rules(), {}, cancelled);
  ASSERT_TRUE(summary.ok());
  EXPECT_EQ(summary.value().figures.files, 1U);
  EXPECT_EQ(summary.value().figures.folders, 1U);
}

TEST(Crawl, TakesAttributesThatItemsCarry) {
  TestVolume volume;
  volume.file("song.mp3", "x");
  volume.folder("marked");
  if (!volume.attribute("song.mp3", "user.kMDItemPurchaseDate", "2024-05-01")) {
    GTEST_SKIP() << "the file system under the tests has no extended attributes";
  }
  volume.attribute("song.mp3", "user.com_brixo_rating", "4.5\n");
  volume.attribute("song.mp3", "user.kMDItemCount", "12");
  volume.attribute("song.mp3", "user.kMDItemEmpty", "");
  volume.attribute("song.mp3", "user.kMDItemBytes", std::string("\xff\0x", 3));
  volume.attribute("song.mp3", "user.kMDItemFSName", "forged");
  volume.attribute("song.mp3", "user.other", "not taken");
  volume.attribute("marked", kPackageMarkAttribute, "1");
  ASSERT_TRUE(volume.update().ok());
  EXPECT_EQ(valueAt(volume, "song.mp3", kMDItemPurchaseDate), told(std::string("2024-05-01")));
  EXPECT_EQ(valueAt(volume, "song.mp3", "com_brixo_rating"), told(4.5));
  EXPECT_EQ(valueAt(volume, "song.mp3", "kMDItemCount"), told(std::int64_t{12}));
  EXPECT_EQ(valueAt(volume, "song.mp3", "kMDItemEmpty"), told(std::string()));
  EXPECT_EQ(valueAt(volume, "song.mp3", "kMDItemBytes"), told(std::string("\xff\0x", 3)));
  EXPECT_EQ(valueAt(volume, "song.mp3", "kMDItemFSName"), told(std::string("song.mp3")));
  EXPECT_EQ(valueAt(volume, "song.mp3", "other"), told(std::nullopt));
  EXPECT_NE(valueAt(volume, "marked", "kMDItemContentType"), told(std::string("public.folder")));
}

TEST(Crawl, MarksCachesAndReceipts) {
  constexpr std::string_view kTag = "Signature: 8a477f597d28d172789f06886806bc55\n";
  TestVolume volume;
  volume.file("CACHEDIR.TAG", kTag);
  volume.file("cache/CACHEDIR.TAG", kTag);
  volume.file("forged/CACHEDIR.TAG", "Signature: none");
  volume.folder("pipe");
  ASSERT_EQ(::mkfifo(volume.at("pipe/CACHEDIR.TAG").c_str(), 0600), 0);
  volume.file("Bought.App/Contents/_DovecartReceipt/receipt");
  volume.file("Folder/Contents/_DovecartReceipt/receipt");
  volume.link("Linked.app/Contents", "../Bought.App/Contents");
  ASSERT_TRUE(volume.update().ok());
  const std::string excluded = told(std::string("com.brixo.backupd")), one = told(std::int64_t{1});
  EXPECT_EQ(valueAt(volume, "cache", "com_brixo_backup_excludeItem"), excluded);
  EXPECT_EQ(valueAt(volume, "forged", "com_brixo_backup_excludeItem"), told(std::nullopt));
  EXPECT_EQ(valueAt(volume, "pipe", "com_brixo_backup_excludeItem"), told(std::nullopt));
  EXPECT_EQ(valueAt(volume, "", "com_brixo_backup_excludeItem"), told(std::nullopt));
  EXPECT_EQ(valueAt(volume, "Bought.App", "kMDItemDovecartHasReceipt"), one);
  EXPECT_EQ(valueAt(volume, "Folder", "kMDItemDovecartHasReceipt"), told(std::nullopt));
  EXPECT_EQ(valueAt(volume, "Linked.app", "kMDItemDovecartHasReceipt"), told(std::nullopt));
}

TEST(Crawl, AccumulatesSizesByPlaceAndType) {
  TestVolume volume;
  volume.file("Some.app/Contents/picture.png", "1234567");
  volume.file("picture.png", "12345");
  volume.file("Mail/cur/1", "123");
  volume.folder("Mail/new");
  volume.folder("Mail/tmp");
  volume.file("NoMail/cur/1", "1");
  const auto summary = volume.update();
  ASSERT_TRUE(summary.ok());
  const AccumulatedSizes::Values& sizes = summary.value().figures.accumulatedSizes.values();
  EXPECT_EQ(sizes[7], 7);
  EXPECT_EQ(sizes[12], 5);
  EXPECT_EQ(sizes[0], 3);
  EXPECT_EQ(sizes[17], 1);
}

TEST(Crawl, TellsWhatCannotBeReadAndGoesOn) {
  TestVolume volume;
  volume.file("a closed/inside");
  volume.file("b only listed/inside");
  volume.file("c open/inside");
  ASSERT_EQ(::chmod(volume.at("a closed").c_str(), 0000), 0);
  ASSERT_EQ(::chmod(volume.at("b only listed").c_str(), 0444), 0);
  // Root reads everything: the crawl is given to a user who does not.
  const bool isRoot = ::geteuid() == 0;
  const std::string cache = volume.root() + "/../user cache";
  ASSERT_EQ(::mkdir(cache.c_str(), 0700), 0);
  if (isRoot) {
    ASSERT_EQ(::chmod((volume.root() + "/..").c_str(), 0755), 0);
    ASSERT_EQ(::chown(cache.c_str(), 65534, 65534), 0);
  }
  const ChildEnd end = inChild([&] {
    if (isRoot && ::setresuid(65534, 65534, 65534) != 0) return 2;
    const std::atomic<bool> cancelled{false};
    const auto summary = updateIndex(StoreFolder(cache), volume.root(), TestVolume::rules(), {}, cancelled);
    if (!summary) return 3;
    const CrawlFigures& figures = summary.value().figures;
    if (figures.files != 1 || figures.folders != 3) return 4;
    if (figures.problems.count != 2 || figures.problems.first.size() != 2) return 5;
    return figures.problems.first[0].code == EACCES && figures.problems.first[0].path.ends_with("a closed")
               ? 0
               : 6;
  });
  EXPECT_TRUE(end.isClean()) << end.status;
}

TEST(Crawl, OutlivesItemsThatComeAndGo) {
  TestVolume volume;
  for (int number = 0; number < 50; ++number) volume.file("steady/" + std::to_string(number));
  std::atomic<bool> isOver{false};
  std::thread unrest([&] {
    while (!isOver.load()) {
      for (const char* name : {"x", "y", "z"}) {
        const std::string path = volume.at(name);
        ::mkdir(path.c_str(), 0700);
        ::mkdir((path + "/deeper").c_str(), 0700);
        ::rmdir((path + "/deeper").c_str());
        ::rmdir(path.c_str());
        if (::symlink("/", path.c_str()) == 0) ::unlink(path.c_str());
      }
    }
  });
  for (int round = 0; round < 20; ++round) {
    const auto summary = volume.update();
    ASSERT_TRUE(summary.ok()) << summary.error().description;
    EXPECT_EQ(summary.value().figures.problems.count, 0U);
    EXPECT_LE(summary.value().figures.files, 53U);
    EXPECT_GE(summary.value().figures.files, 50U);
  }
  isOver = true;
  unrest.join();
}

}  // namespace
}  // namespace norvex
