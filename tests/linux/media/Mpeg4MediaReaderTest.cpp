// The reader on real files.
#include "platform/linux/Mpeg4MediaReader.h"

#include <fcntl.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/inotify.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

#include <array>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

#include "media/Boxes.h"
#include "media/TempFolder.h"
#include "platform/FileDescriptor.h"
#include "platform/linux/CallablePath.h"
#include "tests/support/TreeOnDisk.h"

namespace norvex {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

class Mpeg4MediaReaderTest : public testing::Test {
 protected:
  std::vector<std::string> keysOf(const std::string& path) {
    return shown(reader_.itemKeys(Location::file(path)));
  }

  // Writes the file into the test's folder; its path.
  std::string write(const std::string& name, const Bytes& bytes) {
    const std::string path = folder_ / name;
    std::ofstream(path, std::ios::binary) << bytes.text();
    return path;
  }

  TempFolder folder_;
  Mpeg4MediaReader reader_;
};

// For as long as it lives a test that runs as root is an ordinary user who may look into the folder.
class WithoutRootsRights {
 public:
  explicit WithoutRootsRights(const TempFolder& folder) {
    if (!wasRoot_) return;
    EXPECT_EQ(::chmod((folder / "").c_str(), 0755), 0);
    EXPECT_EQ(::seteuid(kNobody), 0);
  }
  WithoutRootsRights(const WithoutRootsRights&) = delete;
  WithoutRootsRights& operator=(const WithoutRootsRights&) = delete;
  ~WithoutRootsRights() {
    if (!wasRoot_) return;
    EXPECT_EQ(::seteuid(0), 0);
  }

 private:
  static constexpr uid_t kNobody = 65534;
  const bool wasRoot_ = ::geteuid() == 0;
};

const Bytes purchased = joined({fileType(), movie({item("one "), item("purd")})});

TEST_F(Mpeg4MediaReaderTest, ReadsTheKeysOfAFile) {
  EXPECT_THAT(keysOf(write("song.m4a", purchased)), ElementsAre("one ", "purd"));
}

TEST_F(Mpeg4MediaReaderTest, ReadsAFileWhoseMovieStandsBehindGigabytes) {
  const std::string path = folder_ / "film.mp4";
  const std::string head = wideBoxClaiming(16 + (std::uint64_t{6} << 30U), "mdat", {}).text();
  const std::string tail = movie({item("purd")}).text();
  const FileDescriptor file(::open(path.c_str(), O_CREAT | O_WRONLY | O_CLOEXEC, 0600));
  ASSERT_EQ(::pwrite(file.number(), head.data(), head.size(), 0), static_cast<ssize_t>(head.size()));
  ASSERT_EQ(::pwrite(file.number(), tail.data(), tail.size(), 16 + (off_t{6} << 30U)),
            static_cast<ssize_t>(tail.size()));

  EXPECT_THAT(keysOf(path), ElementsAre("purd"));
}

TEST_F(Mpeg4MediaReaderTest, ReadsNamesThatAreNoText) {
  EXPECT_THAT(keysOf(write("\xFF\n\x01.m4a", purchased)), ElementsAre("one ", "purd"));
}

TEST_F(Mpeg4MediaReaderTest, ReadsAFileWhosePathIsLongerThanTheKernelTakes) {
  const ondisk::TreeOnDisk tree({}, ondisk::Medium::memory);
  const std::string path = tree.addChain(100, std::string(200, 'd')) + "/song.m4a";
  const CallablePath callable(path);
  const FileDescriptor file(
      ::openat(callable.folder(), callable.path(), O_CREAT | O_WRONLY | O_CLOEXEC, 0600));
  const std::string bytes = purchased.text();
  ASSERT_EQ(::write(file.number(), bytes.data(), bytes.size()), static_cast<ssize_t>(bytes.size()));

  EXPECT_THAT(keysOf(path), ElementsAre("one ", "purd"));
  EXPECT_THAT(keysOf(path + "x"), IsEmpty());
  EXPECT_THAT(keysOf(path.substr(0, path.size() / 2) + "x" + path.substr(path.size() / 2)), IsEmpty());
}

TEST_F(Mpeg4MediaReaderTest, FindsNothingInWhatIsNoMediaFile) {
  EXPECT_THAT(keysOf(write("empty", {})), IsEmpty());
  EXPECT_THAT(keysOf(write("text", "this is not a media file\n")), IsEmpty());
  EXPECT_THAT(keysOf(folder_ / "missing"), IsEmpty());
  EXPECT_THAT(keysOf(folder_ / ""), IsEmpty());
  EXPECT_THAT(keysOf(write("song.m4a", purchased) + "/"), IsEmpty());
  EXPECT_THAT(keysOf(""), IsEmpty());
}

TEST_F(Mpeg4MediaReaderTest, FindsNothingInAFileThatMayNotBeRead) {
  const std::string path = write("song.m4a", purchased);
  ASSERT_EQ(::chmod(path.c_str(), 0), 0);
  const WithoutRootsRights limited(folder_);
  EXPECT_THAT(keysOf(path), IsEmpty());
}

TEST_F(Mpeg4MediaReaderTest, ReadsAFileOfAnotherUser) {
  if (::geteuid() != 0) GTEST_SKIP() << "only root can make a file of another user";
  const std::string path = write("song.m4a", purchased);
  const WithoutRootsRights limited(folder_);
  EXPECT_THAT(keysOf(path), ElementsAre("one ", "purd"));
}

TEST_F(Mpeg4MediaReaderTest, FollowsNoLink) {
  write("song.m4a", purchased);
  std::filesystem::create_symlink("song.m4a", folder_ / "link.m4a");
  EXPECT_THAT(keysOf(folder_ / "link.m4a"), IsEmpty());
}

TEST_F(Mpeg4MediaReaderTest, ReadsThroughALinkToAFolderOnTheWay) {
  write("song.m4a", purchased);
  std::filesystem::create_directory_symlink(".", folder_ / "here");
  EXPECT_THAT(keysOf(folder_ / "here/song.m4a"), ElementsAre("one ", "purd"));
}

// Knows whether somebody has opened a file since.
class OpeningWatch {
 public:
  explicit OpeningWatch(const std::string& path) : watch_(::inotify_init1(IN_NONBLOCK | IN_CLOEXEC)) {
    EXPECT_GE(::inotify_add_watch(watch_.number(), path.c_str(), IN_OPEN), 0);
  }
  bool hasSeenOne() const {
    std::array<char, 4096> events{};
    return ::read(watch_.number(), events.data(), events.size()) > 0;
  }

 private:
  FileDescriptor watch_;
};

TEST_F(Mpeg4MediaReaderTest, LeavesAFifoUnopened) {
  const std::string path = folder_ / "fifo.m4a";
  ASSERT_EQ(::mkfifo(path.c_str(), 0600), 0);
  const OpeningWatch watch(path);
  EXPECT_THAT(keysOf(path), IsEmpty());
  EXPECT_FALSE(watch.hasSeenOne());
}

TEST_F(Mpeg4MediaReaderTest, LeavesAFifoUnopenedThatHasTakenThePlaceOfAFileThatWasRead) {
  const std::string path = write("song.m4a", purchased);
  const OpeningWatch watchOfFile(path);
  EXPECT_THAT(keysOf(path), ElementsAre("one ", "purd"));
  EXPECT_TRUE(watchOfFile.hasSeenOne());
  std::filesystem::remove(path);
  ASSERT_EQ(::mkfifo(path.c_str(), 0600), 0);
  const OpeningWatch watch(path);
  EXPECT_THAT(keysOf(path), IsEmpty());
  EXPECT_FALSE(watch.hasSeenOne());
}

TEST_F(Mpeg4MediaReaderTest, ReadsFilesOfAFolderThatMayNotBeListed) {
  std::filesystem::create_directories(folder_ / "album");
  const std::vector<std::string> paths = {write("album/1.m4a", purchased), write("album/2.m4a", purchased)};
  ASSERT_EQ(::chmod((folder_ / "album").c_str(), 0711), 0);
  const WithoutRootsRights limited(folder_);
  for (const std::string& path : paths) EXPECT_THAT(keysOf(path), ElementsAre("one ", "purd"));
}

TEST_F(Mpeg4MediaReaderTest, ReadsFilesOfAFolderWithManyNames) {
  for (int number = 0; number < 1000; ++number) write(std::to_string(number) + std::string(200, 'n'), {});
  const std::vector<std::string> paths = {write("1.m4a", purchased), write("2.m4a", purchased)};
  for (const std::string& path : paths) EXPECT_THAT(keysOf(path), ElementsAre("one ", "purd"));
}

TEST_F(Mpeg4MediaReaderTest, ReadsAFileThatCameAfterItsNeighbours) {
  EXPECT_THAT(keysOf(write("1.m4a", purchased)), ElementsAre("one ", "purd"));
  EXPECT_THAT(keysOf(write("2.m4a", purchased)), ElementsAre("one ", "purd"));
}

TEST_F(Mpeg4MediaReaderTest, FindsNothingInASocketOrADevice) {
  sockaddr_un address{};
  address.sun_family = AF_UNIX;
  const std::string path = folder_ / "socket";
  path.copy(address.sun_path, sizeof(address.sun_path) - 1);
  const FileDescriptor socket(::socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0));
  ASSERT_EQ(::bind(socket.number(), reinterpret_cast<const sockaddr*>(&address), sizeof(address)), 0);

  EXPECT_THAT(keysOf(path), IsEmpty());
  EXPECT_THAT(keysOf("/dev/zero"), IsEmpty());
}

TEST_F(Mpeg4MediaReaderTest, LeavesTheTimeOfLastAccessAlone) {
  const auto accessTimeOf = [](const std::string& path) {
    struct stat attributes = {};
    EXPECT_EQ(::stat(path.c_str(), &attributes), 0);
    return attributes.st_atim.tv_sec;
  };
  const std::array<timespec, 2> longAgo = {timespec{1000000000, 0}, timespec{1000000001, 0}};
  const std::string readByAnother = write("another.m4a", purchased);
  const std::string path = write("song.m4a", purchased);
  ASSERT_EQ(::utimensat(AT_FDCWD, readByAnother.c_str(), longAgo.data(), 0), 0);
  ASSERT_EQ(::utimensat(AT_FDCWD, path.c_str(), longAgo.data(), 0), 0);
  std::ifstream(readByAnother).get();
  if (accessTimeOf(readByAnother) == longAgo[0].tv_sec) GTEST_SKIP() << "this volume keeps no access times";

  EXPECT_THAT(keysOf(path), ElementsAre("one ", "purd"));
  EXPECT_EQ(accessTimeOf(path), longAgo[0].tv_sec);
}

TEST_F(Mpeg4MediaReaderTest, ReadsFilesOfOneFolderAfterThoseOfAnother) {
  std::filesystem::create_directories(folder_ / "album");
  std::filesystem::create_directories(folder_ / "other");
  const Bytes bought = joined({fileType(), movie({item("purd")})});
  const std::vector<std::string> paths = {write("album/1.m4a", purchased), write("other/1.m4a", bought),
                                          write("1.m4a", bought), write("album/2.m4a", bought)};
  const std::vector<std::string> all = {"one ", "purd"};
  const std::vector<std::string> one = {"purd"};
  EXPECT_EQ(keysOf(paths[0]), all);
  EXPECT_EQ(keysOf(paths[3]), one);
  EXPECT_EQ(keysOf(paths[1]), one);
  EXPECT_EQ(keysOf(paths[2]), one);
  EXPECT_EQ(keysOf(paths[0]), all);
}

TEST_F(Mpeg4MediaReaderTest, ReadsAFolderThatHasTakenThePlaceOfTheOneBefore) {
  std::filesystem::create_directories(folder_ / "album");
  EXPECT_THAT(keysOf(write("album/1.m4a", purchased)), ElementsAre("one ", "purd"));
  std::filesystem::rename(folder_ / "album", folder_ / "moved");
  std::filesystem::create_directories(folder_ / "album");
  EXPECT_THAT(keysOf(write("album/2.m4a", purchased)), ElementsAre("one ", "purd"));
}

TEST_F(Mpeg4MediaReaderTest, LeavesNothingOpenButTheLastFolder) {
  const auto openFiles = [] {
    const std::filesystem::directory_iterator entries("/proc/self/fd");
    return std::distance(begin(entries), end(entries));
  };
  const std::string good = write("song.m4a", purchased);
  const std::string bad = write("text", "this is not a media file\n");
  const auto before = openFiles();
  {
    Mpeg4MediaReader reader;
    for (const auto& path : {good, bad, folder_ / "missing", folder_ / "", std::string("/dev/zero"), good})
      reader.itemKeys(Location::file(path));
    EXPECT_EQ(openFiles(), before + 1);
  }
  EXPECT_EQ(openFiles(), before);
}

}  // namespace
}  // namespace norvex
