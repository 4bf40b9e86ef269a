#include "tool/IndexShowCommand.h"

#include <gtest/gtest.h>

#include <nlohmann/json.hpp>

#include "ToolTestWorld.h"

namespace norvex {
namespace {

TEST(IndexShow, ShowsEveryAttributeAlsoThoseThatOnlyThisItemHas) {
  ToolTestWorld tool;
  tool.index();
  EXPECT_EQ(runIndexShow(tool.world, {tool.volume() + "//sub/./plain", false}), ExitStatus::success);
  EXPECT_EQ(tool.output(),
            "kMDItemPath                 <volume>/sub/plain\n"
            "kMDItemFSName               plain\n"
            "kMDItemFSSize               7 (7 bytes)\n"
            "kMDItemFSContentChangeDate  2023-11-14 21:56:40 +0000\n"
            "kMDItemContentType          public.data\n"
            "kMDItemContentTypeTree      public.data\n"
            "                            public.item\n"
            "kMDItemKind                 Document\n"
            "kMDItemRating               5\n");
}

TEST(IndexShow, ShowsTheSizesOfAVolume) {
  ToolTestWorld tool;
  tool.index();
  EXPECT_EQ(runIndexShow(tool.world, {tool.volume(), true}), ExitStatus::success);
  const auto document = nlohmann::json::parse(tool.outText.str());
  EXPECT_EQ(document["version"], 1);
  EXPECT_EQ(document["volume"], tool.volume());
  const auto& last = document["attributes"].back();
  EXPECT_EQ(last["name"], "kMDStoreAccumulatedSizes");
  EXPECT_EQ(last["type"], "numbers");
  EXPECT_EQ(last["value"].size(), 18U);
}

TEST(IndexShow, FailsForAnItemThatTheIndexDoesNotHave) {
  ToolTestWorld tool;
  tool.index();
  EXPECT_EQ(runIndexShow(tool.world, {tool.volume() + "/gone", true}), ExitStatus::failed);
  EXPECT_EQ(tool.errors(),
            "norvexctl: <volume>/gone: the index of <volume> has no such item; when it is new, run: "
            "norvexctl index "
            "update <volume>\n");
  const auto document = nlohmann::json::parse(tool.outText.str());
  EXPECT_EQ(document["attributes"], nlohmann::json::array());
  EXPECT_EQ(document["errors"][0]["reason"], "noItem");
}

TEST(IndexShow, AsksOnlyTheVolumeThatThePathIsOn) {
  ToolTestWorld tool;
  tool.index();
  const std::string inner = tool.volume() + "/sub";
  tool.world.isMountPoint = [&](const std::string& path) { return path == inner; };
  EXPECT_EQ(runIndexShow(tool.world, {inner + "/plain", false}), ExitStatus::failed);
  EXPECT_EQ(
      tool.errors(),
      "norvexctl: <volume>/sub: not indexed yet; make the index with: norvexctl index update <volume>/sub\n");
}

}  // namespace
}  // namespace norvex
