#include "tool/PreviewCommand.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <nlohmann/json.hpp>

#include "GoldenFile.h"
#include "MeasuredWorld.h"
#include "scanner/NVXScanner.h"

namespace norvex {
namespace {

using nlohmann::json;
using ::testing::Contains;
using ::testing::HasSubstr;
using ::testing::IsEmpty;
using ::testing::Not;
using ::testing::StartsWith;

constexpr PreviewRequest kText{.updateIndex = false, .json = false};
constexpr PreviewRequest kJson{.updateIndex = false, .json = true};

TEST(Preview, ShowsEachKeyWithItsFigureAndWhatWouldBeSent) {
  MeasuredWorld machine;
  EXPECT_EQ(runPreview(machine.world, kText), ExitStatus::success);
  expectGolden("preview.txt", machine.output());
  EXPECT_EQ(machine.errors(), "");
}

TEST(Preview, SendsAndRecordsNothing) {
  MeasuredWorld machine;
  runPreview(machine.world, kText);
  EXPECT_THAT(machine.diagnosticLog.messages, IsEmpty());
  EXPECT_THAT(machine.calls.all(), Not(Contains(StartsWith("synchronize"))));
}

// What the agent's own report sends over the same machine, as the preview's JSON would have to put it.
json messagesOfTheReport(MeasuredWorld& machine) {
  NVXScanner().scan()->logToWendal();
  json messages = json::array();
  for (const auto& message : machine.diagnosticLog.messages)
    messages.push_back({{"domain", message.domain}, {"level", message.level}, {"pairs", message.pairs}});
  return messages;
}

json withoutFigures(const json& messages) {
  json plain = json::array();
  for (const json& message : messages) {
    json pairs = json::array();
    for (const json& pair : message["pairs"]) pairs.push_back({pair["key"], pair["reported"]});
    plain.push_back({{"domain", message["domain"]}, {"level", message["level"]}, {"pairs", pairs}});
  }
  return plain;
}

TEST(Preview, JsonHoldsWhatTheReportSends) {
  for (const bool isInternal : {false, true}) {
    MeasuredWorld machine;
    machine.installation.isInternal = isInternal;
    EXPECT_EQ(runPreview(machine.world, kJson), ExitStatus::success);
    const json document = json::parse(machine.output());
    EXPECT_EQ(withoutFigures(document["messages"]), messagesOfTheReport(machine));
    EXPECT_EQ(document["messages"].size(), isInternal ? 3U : 2U);
    EXPECT_EQ(document["notSent"].size(), isInternal ? 0U : 1U);
    EXPECT_EQ(document["errors"], json::array());
    const json& first = document["messages"][0]["pairs"];
    EXPECT_EQ(first[0]["figure"], 470'000'000'000);
    EXPECT_EQ(first[17]["figure"], true);
    EXPECT_EQ(first[18]["figure"], 2);
  }
}

TEST(Preview, ShowsAnInternalInstallationItsFolderMessage) {
  MeasuredWorld machine;
  machine.installation.isInternal = true;
  runPreview(machine.world, kText);
  EXPECT_THAT(machine.output(), HasSubstr("com.brixo.norvex.directoryinfo.run4: 12 figures, level 5\n"));
  EXPECT_THAT(machine.output(), Not(HasSubstr("not sent")));
}

TEST(Preview, ShowsADifferenceBelowZeroAsSuch) {
  MeasuredWorld machine;
  machine.metadataIndex.volumes["/"].accumulatedSizes->at(9) = 0;  // no music but what was bought
  runPreview(machine.world, kText);
  EXPECT_THAT(machine.output(),
              ::testing::ContainsRegex("user_music_size +-5_000_000_000  -93024035966911365120"));
  EXPECT_THAT(machine.output(), HasSubstr("A figure below zero: "));
}

TEST(Preview, GivesANarrowTerminalTwoLinesAKey) {
  MeasuredWorld machine({.isTerminal = true, .width = 60});
  runPreview(machine.world, kText);
  EXPECT_THAT(machine.output(),
              HasSubstr("\n  total_used_volume_capacity\n    470_000_000_000   504189521813\n"));
}

TEST(Preview, NamesTheVolumeWhoseIndexIsUnfinished) {
  MeasuredWorld machine;
  machine.metadataIndex.volumes["/media/disk"].hasHealthCheck = false;
  EXPECT_EQ(runPreview(machine.world, kText), ExitStatus::failed);
  EXPECT_EQ(machine.output(), "");
  EXPECT_EQ(
      machine.errors(),
      "norvexctl: /media/disk: the agent reports nothing: the first update of this volume's index is under "
      "way or was interrupted; finish it with: norvexctl index update /media/disk\n");
}

TEST(Preview, NamesAnIncludedPathThatIsNoVolume) {
  MeasuredWorld machine;
  machine.backupSettings.content->includedVolumes = {"/", "/Users/user"};
  machine.metadataIndex.volumes["/Users/user"].hasHealthCheck = false;
  EXPECT_EQ(runPreview(machine.world, kJson), ExitStatus::failed);
  const json document = json::parse(machine.output());
  EXPECT_EQ(document["messages"], json::array());
  EXPECT_EQ(document["errors"][0]["path"], "/Users/user");
  EXPECT_EQ(document["errors"][0]["reason"], "plainFolder");
  EXPECT_THAT(machine.errors(), HasSubstr("is a plain folder of the volume /, "));
}

TEST(Preview, NamesTheVolumeThatCannotBeSearched) {
  MeasuredWorld machine;
  machine.metadataIndex.volumes["/"].refused = {queryPredicates[music]};
  EXPECT_EQ(runPreview(machine.world, kText), ExitStatus::failed);
  EXPECT_EQ(machine.output(), "");
  EXPECT_THAT(machine.errors(), HasSubstr("norvexctl: /: "));
  EXPECT_THAT(machine.errors(), HasSubstr("norvexctl index update /\n"));
}

TEST(Preview, TellsWhatCouldNotBeMeasuredAndDoesNotFailOverIt) {
  MeasuredWorld machine;
  machine.systemControl.failure = 2;
  EXPECT_EQ(runPreview(machine.world, kText), ExitStatus::success);
  EXPECT_EQ(machine.errors(), "norvexctl: Error finding model-id, errno: 2\n");
}

TEST(Preview, ShowsProgressOnATerminalAndTakesItAway) {
  MeasuredWorld machine({.isTerminal = true, .width = 200});
  runPreview(machine.world, kText);
  EXPECT_THAT(machine.errors(),
              ::testing::StartsWith("\r\x1b[2K0:00  0 items measured, 0 items/s  folders of your own"));
  EXPECT_THAT(machine.errors(), ::testing::EndsWith("\r\x1b[2K"));
}

}  // namespace
}  // namespace norvex
