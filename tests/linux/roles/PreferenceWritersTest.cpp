// Processes that write one preference file: killed in the middle of it, and several at once.
#include <fcntl.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstdlib>
#include <random>

#include "ChildProcess.h"
#include "ScratchFolder.h"
#include "StoredPreference.h"
#include "platform/FileDescriptor.h"

namespace norvex {
namespace {

using testing::ElementsAre;

// A process that stores 1, 2, 3, ... without end and writes a byte after each.
class EndlessWriter {
 public:
  explicit EndlessWriter(const std::string& folder) {
    int ends[2] = {};
    if (::pipe2(ends, O_CLOEXEC) != 0) std::abort();
    progress_ = FileDescriptor(ends[0]);
    const FileDescriptor report(ends[1]);
    process_ = ::fork();
    if (process_ != 0) return;
    for (std::int64_t value = 1;; ++value) {
      store(folder, value);
      if (::write(report.number(), "", 1) != 1) ::_exit(1);
    }
  }

  void waitForStores(int count) const {
    for (char byte = 0; count > 0; --count) ASSERT_EQ(::read(progress_.number(), &byte, 1), 1);
  }

  void kill() const {
    ::kill(process_, SIGKILL);
    ::waitpid(process_, nullptr, 0);
  }

 private:
  FileDescriptor progress_;
  pid_t process_ = 0;
};

TEST(PreferenceWriters, OneThatIsKilledLeavesTheOldFileOrTheNew) {
  const ScratchFolder folder;
  folder.write(kFile, R"({"Other": 7})");
  std::mt19937 random(4711);
  int unfinished = 0;
  for (int round = 0; round < 100; ++round) {
    const EndlessWriter writer(folder.path());
    writer.waitForStores(1 + static_cast<int>(random() % 2));
    for (volatile std::uint_fast32_t spins = random() % 400'000; spins > 0;) spins = spins - 1;
    writer.kill();
    const std::optional<double> value = stored(folder.path());
    ASSERT_TRUE(value.has_value()) << contentOf(folder.at(kFile));
    EXPECT_GE(*value, 1.0);
    EXPECT_EQ(JsonPreferenceStore(folder.path()).copyValue("Other", kDomain), 7.0);
    ASSERT_LE(namesIn(folder.path()).size(), 2U) << "unfinished files pile up";
    unfinished += namesIn(folder.path()).size() == 2 ? 1 : 0;
  }
  RecordProperty("killed_in_the_middle", unfinished);
  store(folder.path(), 4);
  EXPECT_EQ(stored(folder.path()), 4.0);
  EXPECT_THAT(namesIn(folder.path()), ElementsAre(kFile));
}

TEST(PreferenceWriters, ThatWriteAtOnceLoseNoKeyOfEachOther) {
  const ScratchFolder folder;
  constexpr int kKeys = 15;
  inChild([&] {
    const std::string prefix = ::fork() == 0 ? "child" : "parent";
    for (int key = 0; key < kKeys; ++key) {
      JsonPreferenceStore preferences(folder.path());
      preferences.setValue(prefix + std::to_string(key), key, kDomain);
      preferences.synchronize(kDomain);
    }
    if (prefix == "child") ::_exit(0);
    return std::string();  // the report ends when the other has closed its end, too
  });
  JsonPreferenceStore preferences(folder.path());
  for (int key = 0; key < kKeys; ++key) {
    EXPECT_EQ(preferences.copyValue("child" + std::to_string(key), kDomain), key);
    EXPECT_EQ(preferences.copyValue("parent" + std::to_string(key), kDomain), key);
  }
  EXPECT_THAT(namesIn(folder.path()), ElementsAre(kFile));
}

}  // namespace
}  // namespace norvex
