#include "platform/linux/MarkerFileInstallation.h"

#include <gtest/gtest.h>

#include <filesystem>

#include "ScratchFolder.h"

namespace norvex {
namespace {

TEST(MarkerFileInstallation, IsInternalAsLongAsTheMarkerExists) {
  const ScratchFolder folder;
  MarkerFileInstallation installation(folder.at("internal-install"));
  EXPECT_FALSE(installation.isInternalInstall());
  folder.write("internal-install", "");
  EXPECT_TRUE(installation.isInternalInstall());
  std::filesystem::remove(folder.at("internal-install"));
  EXPECT_FALSE(installation.isInternalInstall());
}

TEST(MarkerFileInstallation, AMarkerThatCannotBeToldIsNone) {
  const ScratchFolder folder;
  const std::string file = folder.write("file", "");
  EXPECT_FALSE(MarkerFileInstallation(file + "/internal-install").isInternalInstall());
  std::filesystem::create_symlink(folder.at("missing"), folder.at("link"));
  EXPECT_FALSE(MarkerFileInstallation(folder.at("link")).isInternalInstall());
}

}  // namespace
}  // namespace norvex
