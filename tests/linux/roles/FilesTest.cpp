#include "platform/linux/Files.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>

#include "ChildProcess.h"
#include "ScratchFolder.h"
#include "platform/FileDescriptor.h"

namespace norvex {
namespace {

TEST(Files, ReadsNoMoreThanTheLimit) {
  const ScratchFolder folder;
  const std::string path = folder.write("file", std::string(100'000, 'x'));
  EXPECT_EQ(readStartOfFile(path, 70'000).value().size(), 70'000U);
  EXPECT_EQ(readStartOfFile(path, 200'000).value().size(), 100'000U);
  EXPECT_EQ(readWholeFile(path, 100'000).value().size(), 100'000U);
  EXPECT_EQ(readWholeFile(path, 99'999).error().code, EFBIG);
}

TEST(Files, ReadsRegularFilesOnly) {
  const ScratchFolder folder;
  ASSERT_EQ(::mkfifo(folder.at("fifo").c_str(), 0600), 0);
  EXPECT_EQ(readStartOfFile(folder.at("fifo"), 10).error().code, EINVAL);
  EXPECT_EQ(readStartOfFile("/dev/zero", 10).error().code, EINVAL);
  EXPECT_EQ(readStartOfFile(folder.path(), 10).error().code, EISDIR);
  EXPECT_EQ(readStartOfFile(folder.at("missing"), 10).error().code, ENOENT);
}

TEST(Files, ReadsTheKernelsFilesThatClaimToBeEmpty) {
  EXPECT_GT(readStartOfFile("/proc/self/status", 4096).value().size(), 100U);
}

TEST(Files, MakesMissingFoldersForTheUserAlone) {
  const ScratchFolder folder;
  EXPECT_EQ(makePrivateFolders(folder.at("a/b/c")), 0);
  EXPECT_EQ(modeOf(folder.at("a")), 0700U);
  EXPECT_EQ(modeOf(folder.at("a/b/c")), 0700U);
  ::chmod(folder.at("a").c_str(), 0750);
  EXPECT_EQ(makePrivateFolders(folder.at("a/b")), 0);
  EXPECT_EQ(modeOf(folder.at("a")), 0750U) << "one that is there stays as it is";
}

TEST(Files, AFileInTheWayOfAFolderIsAFailure) {
  const ScratchFolder folder;
  const std::string file = folder.write("file", "");
  EXPECT_EQ(makePrivateFolders(file), EEXIST);
  EXPECT_EQ(makePrivateFolders(file + "/below"), EEXIST);
}

TEST(Files, ALockThatSomebodyElseHoldsIsGivenUpAtTheLimit) {
  const ScratchFolder folder;
  const std::string path = folder.write("file", "");
  const FileDescriptor mine(::open(path.c_str(), O_RDONLY));
  {
    const FileDescriptor other(::open(path.c_str(), O_RDONLY));
    ASSERT_TRUE(lockWithin(other.number(), std::chrono::milliseconds(0)));
    EXPECT_FALSE(lockWithin(mine.number(), std::chrono::milliseconds(15)));
  }
  EXPECT_TRUE(lockWithin(mine.number(), std::chrono::milliseconds(0))) << "it ends with the other's file";
}

}  // namespace
}  // namespace norvex
