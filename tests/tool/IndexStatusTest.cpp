#include "tool/IndexStatusCommand.h"

#include <gtest/gtest.h>

#include <nlohmann/json.hpp>

#include "ToolTestWorld.h"

namespace norvex {
namespace {

std::string storeSize(const ToolTestWorld& tool) {
  return std::to_string(tool.storeBytes().size()) + " bytes";
}

TEST(IndexStatus, ShowsTheIndexAndItsSizesLargestFirst) {
  ToolTestWorld tool;
  tool.index();
  EXPECT_EQ(runIndexStatus(tool.world, {{tool.volume()}, false}), ExitStatus::success);
  EXPECT_EQ(tool.output(),
            "<volume>\n"
            "  Updated     2023-11-14 22:13:20 +0000 (2 minutes ago)\n"
            "  Items       5 (4 files, 1 folder)\n"
            "  Unreadable  0\n"
            "  Index       " +
                storeSize(tool) +
                "\n\n"
                "  Images  4000 bytes  ##################################################\n"
                "  Text    1000 bytes  #############\n"
                "  Other      7 bytes\n");
  EXPECT_EQ(tool.errors(), "");
}

TEST(IndexStatus, DrawsNoBarBeyondTheTerminal) {
  ConsoleStyle narrow;
  narrow.width = 32;
  ToolTestWorld tool(narrow);
  tool.index();
  runIndexStatus(tool.world, {{tool.volume()}, false});
  EXPECT_NE(tool.output().find("  Images  4000 bytes  ##########\n"), std::string::npos) << tool.output();
}

TEST(IndexStatus, JsonHoldsEveryFigure) {
  ToolTestWorld tool;
  tool.index();
  EXPECT_EQ(runIndexStatus(tool.world, {{tool.volume()}, true}), ExitStatus::success);
  const auto document = nlohmann::json::parse(tool.outText.str());
  EXPECT_EQ(document["version"], 1);
  EXPECT_EQ(document["errors"], nlohmann::json::array());
  const auto& volume = document["volumes"][0];
  EXPECT_EQ(volume["root"], tool.volume());
  EXPECT_EQ(volume["updated"], "2023-11-14T22:13:20Z");
  EXPECT_EQ(volume["items"], 5);
  EXPECT_EQ(volume["files"], 4);
  EXPECT_EQ(volume["folders"], 1);
  EXPECT_EQ(volume["storeBytes"], tool.storeBytes().size());
  EXPECT_EQ(volume["sizes"].size(), 18U);
  EXPECT_EQ(volume["sizes"]["images"], 4000);
}

TEST(IndexStatus, SaysWhatToDoWithoutAnIndexAndWithADamagedOne) {
  ToolTestWorld missing;
  EXPECT_EQ(runIndexStatus(missing.world, {{missing.volume()}, false}), ExitStatus::failed);
  EXPECT_EQ(missing.errors(),
            "norvexctl: <volume>: not indexed yet; make the index with: norvexctl index update <volume>\n");

  ToolTestWorld damaged;
  damaged.damage();
  EXPECT_EQ(runIndexStatus(damaged.world, {{damaged.volume()}, true}), ExitStatus::failed);
  EXPECT_EQ(damaged.errors(),
            "norvexctl: <volume>: its index <store> is damaged; make it anew with: norvexctl index update "
            "<volume>\n");
  const auto document = nlohmann::json::parse(damaged.outText.str());
  EXPECT_EQ(document["volumes"], nlohmann::json::array());
  EXPECT_EQ(document["errors"][0]["reason"], "damaged");
}

}  // namespace
}  // namespace norvex
