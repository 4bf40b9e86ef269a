#include "platform/linux/ConfBackupSettings.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <utility>

#include "ScratchFolder.h"

namespace norvex {
namespace {

using testing::ElementsAre;
using testing::Optional;
using testing::Pair;

class WrittenLines final : public SystemLog {
 public:
  void syslog(LogLevel level, std::string_view message) override { lines.emplace_back(level, message); }

  std::vector<std::pair<LogLevel, std::string>> lines;
};

class ConfBackupSettingsTest : public testing::Test {
 protected:
  ConfBackupSettings settings() {
    return ConfBackupSettings({folder_.at("user"), folder_.at("etc")}, log_, folder_.at("mountinfo"));
  }
  void writeUsers(std::string_view text) { folder_.write("user/chronel/backup.conf", text); }
  void writeSystems(std::string_view text) { folder_.write("etc/chronel/backup.conf", text); }

  ScratchFolder folder_;
  WrittenLines log_;
};

TEST_F(ConfBackupSettingsTest, WithoutAFileTheyAreNotAvailable) {
  EXPECT_EQ(settings().open(), nullptr);
  EXPECT_THAT(log_.lines, ElementsAre());
}

TEST_F(ConfBackupSettingsTest, AHandleKeepsTheSettingsAsTheyWere) {
  writeSystems(
      "[Backup]\nAutomaticBackups=true\nSkipSystemFiles=true\nDestinations=/d\nIncludedVolumes=/x;/y\n");
  ConfBackupSettings role = settings();
  const auto handle = role.open();
  ASSERT_NE(handle, nullptr);
  writeSystems("[Backup]\n");
  EXPECT_TRUE(handle->automaticBackupsEnabled());
  EXPECT_TRUE(handle->systemFilesSkipped());
  EXPECT_THAT(handle->destinations(), ElementsAre("/d"));
  EXPECT_THAT(handle->includedVolumes(), Optional(ElementsAre("/x", "/y")));
}

TEST_F(ConfBackupSettingsTest, TheUsersFileIsTheOnlyOneRead) {
  writeSystems("[Backup]\nAutomaticBackups=true\nDestinations=/system\n");
  writeUsers("[Backup]\nIncludedVolumes=/mine\n");
  ConfBackupSettings role = settings();
  const auto handle = role.open();
  ASSERT_NE(handle, nullptr);
  EXPECT_FALSE(handle->automaticBackupsEnabled());
  EXPECT_THAT(handle->destinations(), ElementsAre());
  EXPECT_THAT(handle->includedVolumes(), Optional(ElementsAre("/mine")));
}

TEST_F(ConfBackupSettingsTest, AMalformedFileIsToldOnceAndNotAvailable) {
  writeSystems("[Backup]\nAutomaticBackups=true\n");
  writeUsers("[Backup]\nAutomaticBackups=perhaps\n");
  ConfBackupSettings role = settings();
  EXPECT_EQ(role.open(), nullptr);
  EXPECT_EQ(role.open(), nullptr);
  EXPECT_THAT(log_.lines,
              ElementsAre(Pair(LogLevel::error, "Malformed backup settings: " + folder_.at("user") +
                                                    "/chronel/backup.conf:2: AutomaticBackups is neither "
                                                    "true nor false")));
}

TEST_F(ConfBackupSettingsTest, AFileThatCannotBeReadIsToldOnceAndNotAvailable) {
  writeSystems("[Backup]\n");
  std::filesystem::create_directories(folder_.at("user/chronel/backup.conf"));
  ConfBackupSettings role = settings();
  EXPECT_EQ(role.open(), nullptr);
  EXPECT_EQ(role.open(), nullptr);
  EXPECT_THAT(log_.lines,
              ElementsAre(Pair(LogLevel::error, "Unreadable backup settings: " + folder_.at("user") +
                                                    "/chronel/backup.conf: Is a directory")));
}

TEST_F(ConfBackupSettingsTest, AMendedFileIsAvailableAgain) {
  writeUsers("nonsense");
  ConfBackupSettings role = settings();
  EXPECT_EQ(role.open(), nullptr);
  writeUsers("[Backup]\n");
  EXPECT_NE(role.open(), nullptr);
}

TEST_F(ConfBackupSettingsTest, AutomaticVolumesAreThoseThatAreMounted) {
  writeSystems("[Backup]\nIncludedVolumes=auto\n");
  folder_.write("mountinfo",
                "1 0 8:1 / / rw - ext4 /dev/sda1 rw\n2 1 8:2 / /proc rw - ext4 /dev/sda2 rw\n"
                "3 1 0:5 / /dev rw - devtmpfs udev rw\n");
  ConfBackupSettings role = settings();
  EXPECT_THAT(role.open()->includedVolumes(), Optional(ElementsAre("/", "/proc")));
}

TEST_F(ConfBackupSettingsTest, WithoutATableOfMountsAutomaticVolumesAreAbsent) {
  writeSystems("[Backup]\n");
  ConfBackupSettings role = settings();
  const auto handle = role.open();
  EXPECT_EQ(handle->includedVolumes(), std::nullopt);
  EXPECT_EQ(handle->includedVolumes(), std::nullopt);
  EXPECT_THAT(log_.lines,
              ElementsAre(Pair(LogLevel::error, "Unreadable table of mounts: " + folder_.at("mountinfo") +
                                                    ": No such file or directory")));
}

}  // namespace
}  // namespace norvex
