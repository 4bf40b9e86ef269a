#include <gmock/gmock.h>

#include <cerrno>

#include "scanner/NVXScanner.h"
#include "tests/support/TestPlatform.h"

namespace norvex {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;

// --- the hardware model

TEST(HardwareModel, IsWhatTheKernelSays) {
  const std::string longest(63, 'm');
  const std::string umlauts = "Mod\xC3\xA8le \xE2\x82\xAC \xF0\x9F\x98\x80";
  for (const std::string& name : {std::string("Model1,1"), longest, umlauts, std::string()}) {
    TestPlatform world;
    world.systemControl.modelName = name;
    const auto model = NVXScanner::hardwareModelIdentifier();
    ASSERT_NE(model, nullptr) << name;
    EXPECT_EQ(*model, name);
    EXPECT_THAT(world.systemLog.lines, IsEmpty());
  }
}

TEST(HardwareModel, IsAskedForWith64Bytes) {
  TestPlatform world;
  NVXScanner::hardwareModelIdentifier();
  EXPECT_THAT(world.calls.all(), ElementsAre("sysctl 6 2"));
  EXPECT_EQ(world.systemControl.lastLength, 64U);
}

TEST(HardwareModel, EndsAtTheFirstZeroByte) {
  TestPlatform world;
  world.systemControl.modelName = std::string("Model\0rest", 10);
  EXPECT_EQ(*NVXScanner::hardwareModelIdentifier(), "Model");
}

TEST(HardwareModel, IsNothingWithALineWhenTheKernelRefuses) {
  const struct {
    std::string name;
    int failure;
    std::string line;
  } rows[] = {
      {std::string(64, 'm'), 0, "3 Error finding model-id, errno: " + std::to_string(ENOMEM)},
      {std::string(500, 'm'), 0, "3 Error finding model-id, errno: " + std::to_string(ENOMEM)},
      {"Model1,1", ENOENT, "3 Error finding model-id, errno: " + std::to_string(ENOENT)},
  };
  for (const auto& row : rows) {
    TestPlatform world;
    world.systemControl.modelName = row.name;
    world.systemControl.failure = row.failure;
    EXPECT_EQ(NVXScanner::hardwareModelIdentifier(), nullptr);
    EXPECT_THAT(world.systemLog.lines, ElementsAre(row.line));
  }
}

TEST(HardwareModel, IsNothingSilentlyWhenItIsNoUtf8) {
  for (const char* name :
       {"\xFF", "Mod\xE8le", "cut \xE2\x82", "long \xC0\xAF", "half \xED\xA0\x80", "far \xF5\x80\x80\x80"}) {
    TestPlatform world;
    world.systemControl.modelName = name;
    EXPECT_EQ(NVXScanner::hardwareModelIdentifier(), nullptr) << name;
    EXPECT_THAT(world.systemLog.lines, IsEmpty());
  }
}

// --- the volumes that backups include

TEST(IncludedVolumes, AreNothingWithoutBackupSettings) {
  TestPlatform world;
  EXPECT_FALSE(NVXScanner().includedVolumes().has_value());
  EXPECT_THAT(world.systemLog.lines, IsEmpty());
}

TEST(IncludedVolumes, AreHandedOnAsTheyAre) {
  const std::optional<std::vector<std::string>> rows[] = {
      std::nullopt, std::vector<std::string>(), {{"/"}}, {{"/Volumes/B", "/", "/", "/Volumes/A/"}}};
  for (const auto& row : rows) {
    TestPlatform world;
    world.backupSettings.content.emplace();
    world.backupSettings.content->includedVolumes = row;
    EXPECT_EQ(NVXScanner().includedVolumes(), row);
    EXPECT_EQ(world.backupSettings.openHandles, 0);
    EXPECT_THAT(world.calls.all(),
                ElementsAre("openBackupSettings", "includedVolumes", "closeBackupSettings"));
  }
}

}  // namespace
}  // namespace norvex
