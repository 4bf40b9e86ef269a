#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <nlohmann/json.hpp>

#include "MeasuredWorld.h"
#include "ToolTestWorld.h"
#include "tool/DoctorCommand.h"

namespace norvex {
namespace {

using ::testing::HasSubstr;
using State = Finding::State;

const DoctorPlaces kNowhere{"/nowhere/journal", "/nowhere/log", {"/nowhere/pressure"}};

Finding findingOf(const std::vector<Finding>& findings, const std::string& role) {
  for (const Finding& finding : findings) {
    if (finding.role == role) return finding;
  }
  return {role, State::works, "(there is no such finding)", ""};
}

TEST(Doctor, NamesWhatStandsInForServicesThatAreNotThere) {
  MeasuredWorld machine;
  const auto findings = examine(machine.world, kNowhere);
  for (const char* role : {"Diagnostic log", "System log", "Memory pressure"}) {
    EXPECT_EQ(findingOf(findings, role).state, State::fallsBack) << role;
    EXPECT_THAT(findingOf(findings, role).text, HasSubstr("/nowhere/")) << role;
  }
  EXPECT_EQ(findingOf(findings, "Service manager").text, "the agent's job is on");
  EXPECT_EQ(findingOf(findings, "Hardware model").text, "Model1,1");
}

TEST(Doctor, SaysWhatToDoWithoutAServiceManagerAndFails) {
  MeasuredWorld machine;
  machine.job.failure = Error{111, "the session bus: Connection refused"};
  EXPECT_EQ(runDoctor(machine.world, {}, kNowhere), ExitStatus::failed);
  EXPECT_THAT(machine.output(),
              HasSubstr("broken      Service manager\n"
                        "            the session bus: Connection refused; the agent does not run "
                        "by\n            itself\n"
                        "            -> log in to a session that systemd manages\n"));
}

TEST(Doctor, FindsNothingBrokenWhereOnlySubstitutesAreUsed) {
  MeasuredWorld machine;
  machine.systemControl.failure = 2;
  EXPECT_EQ(runDoctor(machine.world, {.json = true}, kNowhere), ExitStatus::success);
  const auto document = nlohmann::json::parse(machine.output());
  EXPECT_EQ(document["version"], 1);
  EXPECT_EQ(document["findings"][0]["state"], "fallsBack");
  EXPECT_EQ(document["findings"][0]["role"], "Diagnostic log");
  EXPECT_NE(document["findings"][0]["remedy"], "");
}

TEST(Doctor, AsksEachRoleThatMeasuresWhatAScanAsksItFirst) {
  MeasuredWorld machine;
  machine.processMemoryInfo.use = MemoryUse{.internal = 5'000'000, .compressed = 2'000'000};
  const auto findings = examine(machine.world, kNowhere);
  for (const char* role : {"Home folder", "Capacity", "Object counts", "Own memory"})
    EXPECT_EQ(findingOf(findings, role).state, State::works) << role;
  EXPECT_EQ(findingOf(findings, "Own memory").text, "measured; this process takes 7 MB");
}

TEST(Doctor, SaysWhatIsLostWhereARoleThatMeasuresFails) {
  MeasuredWorld machine;
  machine.volumeCatalog.failingStep = InMemoryVolumeCatalog::Step::objectCounts;
  machine.processMemoryInfo.use = Error{2, "No such file or directory"};
  const auto findings = examine(machine.world, kNowhere);
  EXPECT_EQ(findingOf(findings, "Object counts").state, State::fallsBack);
  EXPECT_THAT(findingOf(findings, "Object counts").remedy, HasSubstr("norvexctl index update /"));
  EXPECT_EQ(findingOf(findings, "Own memory").text,
            "No such file or directory; the agent goes on however large it grows");
}

TEST(Doctor, TellsCountsOfInodesFromThoseOfAnIndex) {
  MeasuredWorld machine;
  machine.volumeCatalog.countsOfVolume["/"] = {.files = 1000, .folders = 0};
  EXPECT_THAT(findingOf(examine(machine.world, kNowhere), "Object counts").text, HasSubstr("inodes"));
}

// Over a volume with a real index.
class DoctorOfVolumes : public ::testing::Test {
 protected:
  Finding finding(const std::string& volume) {
    return findingOf(examine(tool.world, kNowhere), "Volume " + volume);
  }

  TestPlatform roles;
  ToolTestWorld tool;
};

TEST_F(DoctorOfVolumes, ToldByTheAgeOfTheirIndex) {
  tool.include({tool.volume()});
  EXPECT_EQ(finding(tool.volume()).state, State::fallsBack);
  EXPECT_THAT(finding(tool.volume()).text, HasSubstr("not indexed"));
  tool.index();
  EXPECT_EQ(finding(tool.volume()).state, State::works);
  EXPECT_EQ(finding(tool.volume()).text, "indexed 2 minutes ago");
  tool.world.secondsSince1970 = [] { return ToolTestWorld::kIndexed + 15 * 86400; };
  EXPECT_EQ(finding(tool.volume()).state, State::fallsBack);
  EXPECT_EQ(finding(tool.volume()).text, "indexed 15 days ago, and so out of date");
}

TEST_F(DoctorOfVolumes, FindsAFolderAmongThem) {
  tool.index();
  const std::string folder = tool.volume() + "/sub";
  tool.include({folder});
  EXPECT_EQ(finding(folder).state, State::broken);
  EXPECT_THAT(finding(folder).text, HasSubstr("is a plain folder of the volume " + tool.volume()));
  EXPECT_THAT(finding(folder).remedy,
              HasSubstr("mount its volume, or name " + tool.volume() + " in its place"));
}

TEST_F(DoctorOfVolumes, FindsOneThatIsNotMounted) {
  tool.include({tool.volume() + "/not-there"});
  tool.index();
  EXPECT_EQ(finding(tool.volume() + "/not-there").state, State::fallsBack);
  EXPECT_THAT(finding(tool.volume() + "/not-there").text, HasSubstr("nothing is mounted there"));
}

TEST_F(DoctorOfVolumes, FindsThatNoneIsIncluded) {
  EXPECT_EQ(findingOf(examine(tool.world, kNowhere), "Backup settings").state, State::broken);
}

}  // namespace
}  // namespace norvex
