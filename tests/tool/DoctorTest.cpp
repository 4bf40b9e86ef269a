#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <filesystem>
#include <nlohmann/json.hpp>

#include "MeasuredWorld.h"
#include "ToolTestWorld.h"
#include "platform/linux/Mpeg4MediaReader.h"
#include "tool/DoctorCommand.h"
#include "tool/MediaProbe.h"

namespace norvex {
namespace {

using ::testing::HasSubstr;
using State = Finding::State;

// No service, and folders and a locale that each machine has.
const DoctorPlaces kNowhere{.journalSocket = "/nowhere/journal",
                            .systemLogSocket = "/nowhere/log",
                            .pressureFiles = {"/nowhere/pressure"},
                            .preferenceFolder = "/tmp",
                            .temporaryFolder = "/tmp",
                            .numbersLocale = "C"};

// Whatever file its reader is tried on, it finds the purchase there.
class ExaminedMachine : public MeasuredWorld {
 public:
  ExaminedMachine() { mediaMetadataReader.keysOfOthers = MediaProbe::keys(); }
};

Finding findingOf(const std::vector<Finding>& findings, const std::string& role) {
  for (const Finding& finding : findings) {
    if (finding.role == role) return finding;
  }
  return {role, State::works, "(there is no such finding)", ""};
}

TEST(Doctor, NamesWhatStandsInForServicesThatAreNotThere) {
  ExaminedMachine machine;
  const auto findings = examine(machine.world, kNowhere);
  for (const char* role : {"Diagnostic log", "System log", "Memory pressure"}) {
    EXPECT_EQ(findingOf(findings, role).state, State::fallsBack) << role;
    EXPECT_THAT(findingOf(findings, role).text, HasSubstr("/nowhere/")) << role;
  }
  EXPECT_EQ(findingOf(findings, "Service manager").text, "the agent's job is on");
  EXPECT_EQ(findingOf(findings, "Hardware model").text, "Model1,1");
}

TEST(Doctor, SaysWhatToDoWithoutAServiceManagerAndFails) {
  ExaminedMachine machine;
  machine.job.failure = Error{111, "the session bus: Connection refused"};
  EXPECT_EQ(runDoctor(machine.world, {}, kNowhere), ExitStatus::failed);
  EXPECT_THAT(machine.output(),
              HasSubstr("broken      Service manager\n"
                        "            the session bus: Connection refused; the agent does not run "
                        "by\n            itself\n"
                        "            -> log in to a session that systemd manages\n"));
}

TEST(Doctor, FindsNothingBrokenWhereOnlySubstitutesAreUsed) {
  ExaminedMachine machine;
  machine.systemControl.failure = 2;
  EXPECT_EQ(runDoctor(machine.world, {.json = true}, kNowhere), ExitStatus::success);
  const auto document = nlohmann::json::parse(machine.output());
  EXPECT_EQ(document["version"], 1);
  EXPECT_EQ(document["findings"][0]["state"], "fallsBack");
  EXPECT_EQ(document["findings"][0]["role"], "Diagnostic log");
  EXPECT_NE(document["findings"][0]["remedy"], "");
}

// What can be wrong with a role, and what of the doctor's words must tell of it.
struct Trouble {
  const char* role;
  void (*happens)(MeasuredWorld& machine, DoctorPlaces& places);
  State state;
  const char* words;
};

const Trouble kTroubles[] = {
    {"Service manager",
     [](auto& machine, auto&) {
       machine.job.failure = Error{ENOENT, "no such unit"};
     },
     State::broken, "no such unit; the agent does not run by itself"},
    {"Start of a run",
     [](auto& machine, auto&) {
       machine.job.failure = Error{ENOENT, "no such unit"};
     },
     State::fallsBack, "nobody starts a run"},
    {"Own memory",
     [](auto& machine, auto&) {
       machine.processMemoryInfo.use = Error{2, "no status"};
     },
     State::fallsBack, "no status; the agent goes on however large it grows"},
    {"Event loop", [](auto& machine, auto&) { machine.eventLoops.loop.isStuck = true; }, State::broken,
     "no query would end"},
    {"Clock", [](auto& machine, auto&) { machine.clock.driftPerReading = -1; }, State::broken, "goes back"},
    {"Home folder", [](auto& machine, auto&) { machine.userFolders.homeFolder = "/nowhere"; }, State::broken,
     "/nowhere is not there"},
    {"Home folder",
     [](auto& machine, auto&) { machine.files.put("/Users", folder("user").unreadable(EACCES)); },
     State::broken, "/Users/user cannot be read"},
    {"Walk of folders",
     [](auto& machine, auto&) { machine.files.put("/Users", folder("user").unreadable(EACCES)); },
     State::broken, "/Users/user: Permission denied"},
    {"Attributes of files",
     [](auto& machine, auto&) { machine.files.put("/Users", folder("user").withoutAttributes(EIO)); },
     State::broken, "/Users/user: Input/output error"},
    {"Attributes of files", [](auto& machine, auto&) { machine.files.put("/Users", file("user", 1)); },
     State::broken, "does not show as a folder"},
    {"Capacity", [](auto& machine, auto&) { machine.resourceValues.capacities["/"].clear(); }, State::broken,
     "capacities are reported as 0"},
    {"Object counts",
     [](auto& machine, auto&) {
       machine.volumeCatalog.failingStep = InMemoryVolumeCatalog::Step::objectCounts;
     },
     State::fallsBack, "does not count its files"},
    {"Object counts",
     [](auto& machine, auto&) { machine.volumeCatalog.countsOfVolume["/"] = {.files = 1000, .folders = 0}; },
     State::fallsBack, "inodes are counted as files"},
    {"Reader of media files", [](auto& machine, auto&) { machine.mediaMetadataReader.keysOfOthers = {}; },
     State::broken, "does not find the purchase"},
    {"Reader of media files", [](auto&, auto& places) { places.temporaryFolder = "/nowhere"; },
     State::fallsBack, "not tried: no file can be made for it: No such file"},
    {"Metadata index",
     [](auto& machine, auto&) { machine.metadataIndex.volumes["/"].refused.insert(queryPredicates[images]); },
     State::broken, "do not start on /, so nothing is reported"},
    {"Hardware model", [](auto& machine, auto&) { machine.systemControl.failure = ENOENT; }, State::fallsBack,
     "left out of the summary"},
    {"Byte counts", [](auto&, auto& places) { places.numbersLocale = "xx_XX.none"; }, State::fallsBack,
     "written as 1.23 GB: there is no locale xx_XX.none"},
    {"Preferences", [](auto&, auto& places) { places.preferenceFolder = "/dev/null/norvex"; },
     State::fallsBack, "each run would report again"},
    {"Backup settings",
     [](auto& machine, auto&) { machine.backupSettings.content->includedVolumes.emplace(); }, State::broken,
     "they include no volume"},
};

TEST(Doctor, TellsWhatIsWrongWithARoleThatWorksElsewhere) {
  for (const Trouble& trouble : kTroubles) {
    SCOPED_TRACE(std::string(trouble.role) + ": " + trouble.words);
    {
      ExaminedMachine machine;
      EXPECT_EQ(findingOf(examine(machine.world, kNowhere), trouble.role).state, State::works);
    }
    ExaminedMachine machine;
    DoctorPlaces places = kNowhere;
    trouble.happens(machine, places);
    const Finding finding = findingOf(examine(machine.world, places), trouble.role);
    EXPECT_EQ(finding.state, trouble.state);
    EXPECT_THAT(finding.text, HasSubstr(trouble.words));
  }
}

TEST(Doctor, LowersItsOwnPriorityAtTheDiskLast) {
  ExaminedMachine machine;
  const auto findings = examine(machine.world, kNowhere);
  EXPECT_EQ(findings.back().role, "Priority at the disk");
  // The machine in memory has not lowered it.
  EXPECT_EQ(findings.back().state, State::fallsBack);
  EXPECT_THAT(machine.calls.all(), ::testing::Contains("throttleDiskIO"));
}

TEST(Doctor, TriesTheReaderOnAFileThatTheRealOneUnderstands) {
  const ondisk::TreeOnDisk folder;
  Mpeg4MediaReader reader;
  {
    const auto probe = MediaProbe::in(folder.path());
    ASSERT_TRUE(probe.ok());
    EXPECT_EQ(reader.itemKeys(probe.value().file()), MediaProbe::keys());
    EXPECT_FALSE(std::filesystem::is_empty(folder.path()));
  }
  EXPECT_TRUE(std::filesystem::is_empty(folder.path()));
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
