#include "tool/IndexUpdateCommand.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <nlohmann/json.hpp>

#include "ToolTestWorld.h"

namespace norvex {
namespace {

using ::testing::HasSubstr;

TEST(IndexUpdate, SumsUpEachVolume) {
  ToolTestWorld tool;
  EXPECT_EQ(runIndexUpdate(tool.world, {{tool.volume()}, false}), ExitStatus::success);
  EXPECT_EQ(tool.output(),
            "<volume>: 5 items (4 files, 1 folder) in 0.0 s (0 items/s), 0 unreadable, index " +
                std::to_string(tool.storeBytes().size()) + " bytes\n");
  EXPECT_EQ(tool.errors(), "");
}

TEST(IndexUpdate, TakesTheIncludedVolumesAndGoesOnAfterOneThatIsNotThere) {
  ToolTestWorld tool;
  tool.include({"/not/there", tool.volume() + "/"});
  EXPECT_EQ(runIndexUpdate(tool.world, {}), ExitStatus::failed);
  EXPECT_EQ(tool.errors(),
            "norvexctl: /not/there: not indexed: no volume is mounted there; mount it, or take it out of "
            "IncludedVolumes in chronel/backup.conf\n");
  EXPECT_THAT(tool.output(), HasSubstr("<volume>: 5 items"));
}

TEST(IndexUpdate, DoesNothingWithoutBackupSettingsAndSaysSo) {
  ToolTestWorld tool;
  EXPECT_EQ(runIndexUpdate(tool.world, {}), ExitStatus::success);
  EXPECT_EQ(tool.output(), "");
  EXPECT_THAT(tool.errors(), HasSubstr("nothing was done"));
}

TEST(IndexUpdate, LeavesTheIndexWhenItIsStopped) {
  ToolTestWorld tool;
  tool.index();
  const std::string before = tool.storeBytes();
  tool.cancelled = true;
  EXPECT_EQ(runIndexUpdate(tool.world, {{tool.volume()}, true}), ExitStatus::failed);
  EXPECT_EQ(tool.storeBytes(), before);
  EXPECT_EQ(tool.errors(), "norvexctl: <volume>: not indexed: stopped; the index that it has is as it was\n");
  EXPECT_EQ(nlohmann::json::parse(tool.outText.str())["errors"][0]["reason"], "stopped");
}

TEST(IndexUpdate, ReplacesADamagedIndex) {
  ToolTestWorld tool;
  tool.damage();
  EXPECT_EQ(runIndexUpdate(tool.world, {{tool.volume()}, true}), ExitStatus::success);
  const auto document = nlohmann::json::parse(tool.outText.str());
  EXPECT_EQ(document["version"], 1);
  EXPECT_EQ(document["volumes"][0]["items"], 5);
  EXPECT_EQ(document["volumes"][0]["storeBytes"], tool.storeBytes().size());
}

TEST(IndexUpdate, ShowsProgressOnATerminalAndWipesItAway) {
  ConsoleStyle terminal;
  terminal.isTerminal = true;
  terminal.width = 200;
  ToolTestWorld tool(terminal);
  runIndexUpdate(tool.world, {{tool.volume()}, false});
  EXPECT_EQ(tool.errors(), "\r\x1b[2K0:00  0 items, 0 bytes, 0 items/s  <volume>\r\x1b[2K");
}

}  // namespace
}  // namespace norvex
