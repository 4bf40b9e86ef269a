// The real program among damaged files, odd arguments, full disks and kills: it ends with status 0, and loses
// nothing.
#include <gtest/gtest.h>
#include <poll.h>
#include <sched.h>
#include <sys/mount.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <csignal>
#include <nlohmann/json.hpp>
#include <random>

#include "AgentWorld.h"

namespace norvex {
namespace {

namespace fs = std::filesystem;
using nlohmann::json;

TEST(BadInput, AnyArgumentsBesideForceAreIgnored) {
  const std::vector<std::vector<std::string>> rows = {
      {"--force", "--force"}, {"--help", "--force"},           {"--force=1", "--force"},
      {"", "--force"},        {"\xff\xfe", "--force", "%s%n"}, {std::string(100'000, 'x'), "--force"},
  };
  for (const auto& arguments : rows) {
    AgentWorld world;
    EXPECT_EQ(world.run(arguments), 0) << arguments.front().substr(0, 20);
    EXPECT_EQ(world.messages().size(), 2U) << arguments.front().substr(0, 20);
  }
}

TEST(BadInput, DamagedPreferencesAreKeptAside) {
  for (const char* damaged : {"", "{", "[1, 2]", "\xff\xff\xff", "{\"LastVersionRun\": 4"}) {
    AgentWorld world;
    AgentWorld::write(world.preferenceFile(), damaged);
    EXPECT_EQ(world.run({"--force"}), 0) << damaged;
    EXPECT_EQ(json::parse(AgentWorld::read(world.preferenceFile()).value_or("")),
              json({{"LastVersionRun", 4}}))
        << damaged;
    EXPECT_EQ(AgentWorld::read(world.preferenceFile().string() + ".damaged"), damaged);
  }
}

TEST(BadInput, OtherPreferencesSurvive) {
  AgentWorld world;
  AgentWorld::write(world.preferenceFile(), R"({"Other": [1, "two"], "LastVersionRun": 3})");
  EXPECT_EQ(world.run({"--force"}), 0);
  EXPECT_EQ(json::parse(AgentWorld::read(world.preferenceFile()).value_or("")),
            json::parse(R"({"Other": [1, "two"], "LastVersionRun": 4})"));
}

TEST(BadInput, MalformedBackupSettingsLeaveEveryVolumeOut) {
  for (const char* malformed :
       {"no settings at all\n", "AutomaticBackups=perhaps\n", "[Backup\n", "\xff\xfe\n"}) {
    AgentWorld world;
    AgentWorld::write(world.backupSettingsFile(), std::string("[Backup]\nIncludedVolumes=/\n") + malformed);
    EXPECT_EQ(world.run({"--force"}), 0) << malformed;
    ASSERT_EQ(world.messages().size(), 2U) << malformed;
    EXPECT_EQ(json::parse(world.messages()[0])["pairs"][0][1], "0") << malformed;
  }
}

TEST(BadInput, AHomeFolderThatIsUnsetRelativeOrMissingDoesNotStopARun) {
  for (const char* home : {"", "relative/home", "/nonexistent/home"}) {
    AgentWorld world;
    AgentWorld::write(world.backupSettingsFile(), "[Backup]\nIncludedVolumes=\n");
    world.environment["HOME"] = home;
    EXPECT_EQ(world.run({"--force"}), 0) << home;
    EXPECT_EQ(world.messages().size(), 2U) << home;
  }
  AgentWorld world;
  AgentWorld::write(world.backupSettingsFile(), "[Backup]\nIncludedVolumes=\n");
  world.environment.erase("HOME");
  EXPECT_EQ(world.run({"--force"}), 0);
}

TEST(BadInput, AnUnwritableStateFolderStillLetsTheReleaseBeRecorded) {
  AgentWorld world;
  fs::remove(world.state());
  AgentWorld::write(world.state(), "a file where the folder should be");
  EXPECT_EQ(world.run({"--force"}), 0);
  EXPECT_TRUE(fs::exists(world.preferenceFile()));
  EXPECT_EQ(AgentWorld::read(world.state()), "a file where the folder should be");
}

TEST(BadInput, AnUnwritableSettingsFolderStillLetsTheReportBeMade) {
  AgentWorld world;
  fs::remove(world.config());
  AgentWorld::write(world.config(), "a file where the folder should be");
  EXPECT_EQ(world.run({"--force"}), 0);
  EXPECT_EQ(world.messages().size(), 2U);
}

// A disk of 16 KiB without a free byte, mounted over `folder` in the process's own view of the files.
void mountFullDisk(const fs::path& folder) {
  if (unshare(CLONE_NEWNS) != 0 || mount("", "/", nullptr, MS_REC | MS_PRIVATE, nullptr) != 0 ||
      mount("tmpfs", folder.c_str(), "tmpfs", 0, "size=16k") != 0) {
    _exit(77);
  }
}

TEST(BadInput, AFullDiskLeavesTheOldPreferencesWhole) {
  AgentWorld world;
  const fs::path report = world.root() / "seen";
  world.beforeExec = [&] {
    mountFullDisk(world.config());
    AgentWorld::write(world.preferenceFile(), R"({"LastVersionRun": 3})");
    AgentWorld::write(world.config() / "filler", std::string(64 * 1024, 'x'));
    // The mount ends with the process, so a watcher outside could not see what it left: a child of the same
    // view looks after its end.
    const pid_t agent = fork();
    if (agent == 0) return;
    const int status = AgentWorld::wait(agent);
    AgentWorld::write(report, AgentWorld::read(world.preferenceFile()).value_or("gone"));
    std::size_t files = 0;
    for ([[maybe_unused]] const auto& entry : fs::directory_iterator(world.preferenceFile().parent_path()))
      ++files;
    _exit(status != 0 ? status : files == 1 ? 0 : 70);
  };
  const int status = world.run({"--force"});
  if (status == 77) GTEST_SKIP() << "mounting a file system of one's own is not allowed here";
  EXPECT_EQ(status, 0) << "70: something beside the preferences was left behind";
  EXPECT_EQ(AgentWorld::read(report), R"({"LastVersionRun": 3})");
  EXPECT_EQ(world.messages().size(), 2U);
}

// Lets the process run for this long and kills it, unless it has ended by then.
void killAfter(pid_t process, std::chrono::microseconds delay) {
  pollfd ended = {static_cast<int>(syscall(SYS_pidfd_open, process, 0)), POLLIN, 0};
  const timespec limit = {0, static_cast<long>(delay.count() * 1000)};
  ppoll(&ended, 1, &limit, nullptr);
  kill(process, SIGKILL);
  close(ended.fd);
}

TEST(BadInput, AKillAtAnyMomentLosesNothing) {
  AgentWorld world;
  AgentWorld::write(world.backupSettingsFile(), "[Backup]\nIncludedVolumes=\n");
  const std::string before = R"({"LastVersionRun": 3})";
  std::mt19937 random(4);
  // The length of a whole run is the range of the moments.
  const auto started = std::chrono::steady_clock::now();
  ASSERT_EQ(world.run({"--force"}), 0);
  const auto wholeRun =
      std::chrono::duration_cast<std::chrono::microseconds>(std::chrono::steady_clock::now() - started);

  int killed = 0;
  for (int round = 0; round < 100; ++round) {
    AgentWorld::write(world.preferenceFile(), before);
    const pid_t process = world.start({"--force"});
    killAfter(process, wholeRun * static_cast<int>(random() % 1000) / 1000);
    killed += AgentWorld::wait(process) != 0 ? 1 : 0;
    const json after = json::parse(AgentWorld::read(world.preferenceFile()).value_or(""), nullptr, false);
    ASSERT_TRUE(after == json({{"LastVersionRun", 3}}) || after == json({{"LastVersionRun", 4}})) << after;
  }
  EXPECT_GT(killed, 0);

  // A message that a kill cut short is followed by whole ones, and nothing but it is unreadable.
  const std::size_t linesBefore = world.messages().size();
  ASSERT_EQ(world.run({"--force"}), 0);
  const std::vector<std::string> lines = world.messages();
  ASSERT_EQ(lines.size(), linesBefore + 2);
  EXPECT_TRUE(json::accept(lines[linesBefore]));
  EXPECT_TRUE(json::accept(lines[linesBefore + 1]));
}

}  // namespace
}  // namespace norvex
