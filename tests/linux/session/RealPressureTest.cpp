// Memory that is really short: a program that reads more than its memory control group may hold, again and
// again. Run as root, who may make such a group.
#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/mman.h>
#include <sys/mount.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <filesystem>
#include <fstream>
#include <semaphore>

#include "Session.h"
#include "platform/linux/FileDescriptor.h"
#include "platform/linux/KernelMemoryPressureSource.h"
#include "platform/linux/PressureTriggers.h"
#include "platform/linux/SteadyClock.h"

namespace norvex {
namespace {

namespace fs = std::filesystem;

constexpr MemoryPressureLevels kBoth{.warning = true, .critical = true};
constexpr std::size_t kMemoryLimit = std::size_t{64} << 20;
constexpr std::size_t kFileSize = std::size_t{160} << 20;
constexpr std::chrono::seconds kPatience{30};

// A control group, removed with the object.
class Group {
 public:
  explicit Group(fs::path path) : path_(std::move(path)) {
    std::error_code error;
    fs::create_directory(path_, error);
    isThere_ = !error;
  }
  ~Group() {
    if (isThere_) ::rmdir(path_.c_str());
  }
  Group(const Group&) = delete;
  Group& operator=(const Group&) = delete;

  const fs::path& path() const { return path_; }
  explicit operator bool() const { return isThere_; }

 private:
  fs::path path_;
  bool isThere_ = false;
};

bool writeTo(const fs::path& file, const std::string& text) {
  std::ofstream stream(file);
  stream << text << std::flush;
  return stream.good();
}

// Where groups with a memory limit can be made, and the name of the limit; empty where nowhere.
struct Hierarchy {
  fs::path folder;
  std::string limit;
};

Hierarchy memoryHierarchy() {
  if (writeTo("/sys/fs/cgroup/cgroup.subtree_control", "+memory")) return {"/sys/fs/cgroup", "memory.max"};
  const fs::path folder = "/run/norvex-memory";
  fs::create_directories(folder);
  if (::mount("cgroup", folder.c_str(), "cgroup", 0, "memory") != 0) return {};
  return {folder, "memory.limit_in_bytes"};
}

// A file that is on the disk and not in memory.
class FileOnDisk {
 public:
  FileOnDisk() : path_("/var/tmp/norvex-pressure") {
    const FileDescriptor file(::open(path_.c_str(), O_RDWR | O_CREAT | O_TRUNC | O_CLOEXEC, 0600));
    const std::string piece(std::size_t{1} << 20, 'x');
    for (std::size_t size = 0; size < kFileSize; size += piece.size()) {
      EXPECT_EQ(::write(file.number(), piece.data(), piece.size()), static_cast<ssize_t>(piece.size()));
    }
    ::fdatasync(file.number());
    ::posix_fadvise(file.number(), 0, 0, POSIX_FADV_DONTNEED);
  }
  ~FileOnDisk() { ::unlink(path_.c_str()); }
  FileOnDisk(const FileOnDisk&) = delete;
  FileOnDisk& operator=(const FileOnDisk&) = delete;

  const std::string& path() const { return path_; }

 private:
  std::string path_;
};

[[noreturn]] void readWithoutEnd(const std::string& path) {
  const FileDescriptor file(::open(path.c_str(), O_RDONLY | O_CLOEXEC));
  void* mapping = ::mmap(nullptr, kFileSize, PROT_READ, MAP_SHARED, file.number(), 0);
  if (mapping == MAP_FAILED) ::_exit(1);
  const volatile char* bytes = static_cast<const char*>(mapping);
  while (true) {
    for (std::size_t at = 0; at < kFileSize; at += 4096) static_cast<void>(bytes[at]);
  }
}

// A process in the groups that reads more than it may hold, ended with the object.
class Reader {
 public:
  Reader(const std::vector<fs::path>& groups, const std::string& path) : process_(::fork()) {
    if (process_ != 0) return;
    for (const fs::path& group : groups) {
      if (!writeTo(group / "cgroup.procs", "0")) ::_exit(1);
    }
    readWithoutEnd(path);
  }
  ~Reader() {
    ::kill(process_, SIGKILL);
    ::waitpid(process_, nullptr, 0);
  }
  Reader(const Reader&) = delete;
  Reader& operator=(const Reader&) = delete;

  bool isRunning() const { return ::waitpid(process_, nullptr, WNOHANG) == 0; }

 private:
  pid_t process_;
};

TEST(KernelMemoryPressureSource, MemoryThatIsReallyShortIsAnEvent) {
  const Hierarchy memory = memoryHierarchy();
  if (memory.folder.empty()) GTEST_SKIP() << "no memory control groups can be made here";
  const Group small(memory.folder / "norvex-small");
  if (!small || !writeTo(small.path() / memory.limit, std::to_string(kMemoryLimit))) {
    GTEST_SKIP() << "no memory limit can be set in " << small.path();
  }
  // Of the two hierarchies only the unified one states the pressure: where the limit belongs to the other,
  // the reader is in a group of each.
  const Group unified("/sys/fs/cgroup/norvex-unified");
  const bool isLimitUnified = memory.folder == unified.path().parent_path();
  const fs::path watched = isLimitUnified ? small.path() : unified.path();
  if (!PressureTriggers::onFile(watched / "memory.pressure", kBoth))
    GTEST_SKIP() << "no trigger on " << watched;

  const FileOnDisk file;
  SteadyClock clock;
  MemoryPressurePlaces places;
  places.pressureFiles = {watched / "memory.pressure"};
  KernelMemoryPressureSource source(places, clock);
  std::counting_semaphore<> events(0);
  const auto subscription = source.create(kBoth);
  subscription->setHandler([&] { events.release(); });
  subscription->resume();
  EXPECT_FALSE(events.try_acquire()) << "nothing runs in the group yet";

  const Reader reader({small.path(), watched}, file.path());
  EXPECT_TRUE(events.try_acquire_for(kPatience));
  EXPECT_TRUE(reader.isRunning()) << "the pressure came from elsewhere";
}

TEST(PressureTriggers, AControlGroupThatIsRemovedEndsThem) {
  std::unique_ptr<PressureSensor> sensor;
  {
    const Group group("/sys/fs/cgroup/norvex-removed");
    Result<std::unique_ptr<PressureSensor>> made =
        PressureTriggers::onFile(group.path() / "memory.pressure", kBoth);
    if (!made) GTEST_SKIP() << "no trigger on a control group: " << made.error().description;
    sensor = std::move(made).value();
  }
  std::vector<pollfd> files(sensor->awaited().begin(), sensor->awaited().end());
  ASSERT_GT(
      ::poll(files.data(), files.size(), static_cast<int>(std::chrono::milliseconds(kPatience).count())), 0);
  EXPECT_EQ(sensor->judge(files, {}), PressureVerdict::gone);
}

}  // namespace
}  // namespace norvex
