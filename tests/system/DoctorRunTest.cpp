// The companion command's doctor on this very machine: the roles that each machine has are found at work.
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <filesystem>
#include <map>
#include <nlohmann/json.hpp>
#include <string>

#include "AgentWorld.h"
#include "OwnVolume.h"

namespace norvex {
namespace {

using nlohmann::json;

TEST(DoctorRun, FindsTheRolesAtWorkThatEachMachineHasAndLeavesNothingBehind) {
  AgentWorld world;
  const std::filesystem::path temporary = world.root() / "tmp", findings = world.root() / "findings.json";
  std::filesystem::create_directory(temporary);
  AgentWorld::write(world.home() / "letter.txt", "x");
  world.environment["TMPDIR"] = temporary;
  world.environment["LC_ALL"] = "C";
  const pid_t process = fork();
  if (process == 0) _exit(runTool(world, {"doctor", "--json"}, findings));
  EXPECT_EQ(AgentWorld::wait(process), 1) << "no volume is included";

  std::map<std::string, std::string> stateOf, textOf;
  const json document = json::parse(AgentWorld::read(findings).value_or(""));
  for (const json& finding : document["findings"]) {
    stateOf[finding["role"]] = finding["state"];
    textOf[finding["role"]] = finding["message"];
  }
  EXPECT_EQ(stateOf["Backup settings"], "broken");
  for (const char* role : {"Own memory", "Event loop", "Clock", "Home folder", "Walk of folders",
                           "Attributes of files", "Capacity", "Reader of media files", "Metadata index",
                           "Byte counts", "Preferences", "Folder of the indexes", "Priority at the disk"})
    EXPECT_EQ(stateOf[role], "works") << role << ": " << textOf[role];
  EXPECT_THAT(textOf["Walk of folders"], testing::HasSubstr("begins with letter.txt"));
  EXPECT_TRUE(std::filesystem::is_empty(temporary));
  EXPECT_TRUE(std::filesystem::is_empty(world.config()));
  EXPECT_TRUE(std::filesystem::is_empty(world.state()));
}

}  // namespace
}  // namespace norvex
