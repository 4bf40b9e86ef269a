// The real program, run at once on a real home folder.
#include <gtest/gtest.h>
#include <sys/statvfs.h>

#include <nlohmann/json.hpp>

#include "AgentWorld.h"
#include "results/NVXScannerResults.h"
#include "results/ReportTables.h"

namespace norvex {
namespace {

namespace fs = std::filesystem;
using nlohmann::json;

std::string valueOf(const json& message, const std::string& key) {
  for (const json& pair : message["pairs"]) {
    if (pair[0] == "com.brixo.message." + key) return pair[1];
  }
  return "(no such key)";
}

std::vector<std::string> keysOf(const json& message) {
  std::vector<std::string> keys;
  for (const json& pair : message["pairs"]) keys.push_back(pair[0]);
  return keys;
}

// A file of this size without its blocks.
void makeFile(const fs::path& file, std::uintmax_t size) {
  AgentWorld::write(file, "");
  fs::resize_file(file, size);
}

TEST(ForcedRun, ReportsSizesAndCountsAndRecordsTheRelease) {
  AgentWorld world;
  ASSERT_EQ(world.run({"--force"}), 0);

  const std::vector<std::string> lines = world.messages();
  ASSERT_EQ(lines.size(), 2U);
  EXPECT_EQ(json::parse(lines[0])["domain"], "com.brixo.norvex.run2");
  EXPECT_EQ(json::parse(lines[1])["domain"], "com.brixo.norvex.filecounts.run3");
  EXPECT_EQ(json::parse(AgentWorld::read(world.preferenceFile()).value_or("{}")),
            json({{"LastVersionRun", 4}}));
}

TEST(ForcedRun, SendsEveryKeyInOrder) {
  AgentWorld world;
  ASSERT_EQ(world.run({"--force"}), 0);
  const std::vector<std::string> lines = world.messages();
  ASSERT_EQ(lines.size(), 2U);
  for (std::size_t i = 0; i < lines.size(); ++i) {
    std::vector<std::string> expected;
    for (const auto& row : reportMessages()[i].rows) expected.emplace_back(row.key);
    EXPECT_EQ(keysOf(json::parse(lines[i])), expected);
  }
}

TEST(ForcedRun, MeasuresTheDownloadsFolderAsItIs) {
  AgentWorld world;
  makeFile(world.home() / "Downloads/one.iso", 1'000'000'000);
  makeFile(world.home() / "Downloads/.hidden/two", 234'567);
  fs::create_symlink("one.iso", world.home() / "Downloads/link");  // 7 bytes, its own
  ASSERT_EQ(world.run({"--force"}), 0);
  EXPECT_EQ(valueOf(json::parse(world.messages().at(0)), "user_downloads_size"),
            NVXScannerResults::bucketedStringFromSize(1'000'000'000 + 234'567 + 7));
}

TEST(ForcedRun, MeasuresThePhoneBackups) {
  AgentWorld world;
  makeFile(world.home() / "Library/Application Support/Handlink/Backup/phone/0001", 5'000'000);
  ASSERT_EQ(world.run({"--force"}), 0);
  EXPECT_EQ(valueOf(json::parse(world.messages().at(0)), "user_kyt_backup_size"), "5041895");
}

TEST(ForcedRun, FindsMailOnlyWhereAnEntryOfThatNameAlsoLiesInTheMailFolder) {
  AgentWorld world;
  makeFile(world.home() / "Library/Mail/V2/IMAP-a/inbox", 1'000'000);
  makeFile(world.home() / "Library/Mail/V3/IMAP-b/inbox", 1'000'000);
  makeFile(world.home() / "Library/Mail/IMAP-b/inbox", 3'000);
  ASSERT_EQ(world.run({"--force"}), 0);
  EXPECT_EQ(valueOf(json::parse(world.messages().at(0)), "user_imap_email_size"),
            NVXScannerResults::bucketedStringFromSize(3'000));
}

TEST(ForcedRun, TakesTheStartupDiskFromTheKernel) {
  AgentWorld world;
  AgentWorld::write(world.backupSettingsFile(), "[Backup]\nIncludedVolumes=/\n");
  struct statvfs root = {};
  ASSERT_EQ(statvfs("/", &root), 0);
  ASSERT_EQ(world.run({"--force"}), 0);
  const json sizes = json::parse(world.messages().at(0));
  EXPECT_EQ(valueOf(sizes, "total_startup_disk_size"),
            NVXScannerResults::bucketedStringFromSize(root.f_blocks * root.f_frsize));
  // The used figures move while the test runs; both come from the same reading.
  EXPECT_NE(valueOf(sizes, "used_startup_disk_capacity"), "0");
  EXPECT_EQ(valueOf(sizes, "used_startup_disk_capacity"), valueOf(sizes, "total_used_volume_capacity"));
}

TEST(ForcedRun, CarriesTheBackupSettings) {
  AgentWorld world;
  AgentWorld::write(world.backupSettingsFile(),
                    "[Backup]\nAutomaticBackups=TRUE\nSkipSystemFiles=true\nDestinations=/a; ssh://b/c ;\n"
                    "IncludedVolumes=\n");
  ASSERT_EQ(world.run({"--force"}), 0);
  const json sizes = json::parse(world.messages().at(0));
  EXPECT_EQ(valueOf(sizes, "chronel_auto_backup_enabled"), "1");
  EXPECT_EQ(valueOf(sizes, "chronel_destinations_count"), "2");
  EXPECT_EQ(valueOf(sizes, "chronel_system_files_skipped"), "1");
}

TEST(ForcedRun, RunsAgainWhenThisReleaseHasReported) {
  AgentWorld world;
  ASSERT_EQ(world.run({"--force"}), 0);
  ASSERT_EQ(world.run({"--force"}), 0);
  EXPECT_EQ(world.messages().size(), 4U);
}

TEST(ForcedRun, LeavesNothingInTheHomeFolder) {
  AgentWorld world;
  ASSERT_EQ(world.run({"--force"}), 0);
  EXPECT_TRUE(fs::is_empty(world.home()));
}

TEST(ForcedRun, KeepsWhatItWritesFromOtherUsers) {
  AgentWorld world;
  ASSERT_EQ(world.run({"--force"}), 0);
  const auto permissions = [](const fs::path& path) { return fs::status(path).permissions(); };
  EXPECT_EQ(permissions(world.messagesFile()), fs::perms::owner_read | fs::perms::owner_write);
  EXPECT_EQ(permissions(world.messagesFile().parent_path()), fs::perms::owner_all);
  EXPECT_EQ(permissions(world.preferenceFile()), fs::perms::owner_read | fs::perms::owner_write);
}

}  // namespace
}  // namespace norvex
