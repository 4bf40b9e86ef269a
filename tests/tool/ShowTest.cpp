#include "tool/ShowCommand.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <nlohmann/json.hpp>

#include "GoldenFile.h"
#include "MeasuredWorld.h"

namespace norvex {
namespace {

using ::testing::HasSubstr;
using ::testing::Not;

std::string contentOf(const std::string& path) {
  std::ifstream file(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(file), {}};
}

ExitStatus writePage(MeasuredWorld& machine, const std::string& path) {
  return runShow(machine.world, {.updateIndex = false, .json = false, .htmlFile = path});
}

TEST(Show, DrawsVolumesKindsPlacesAndPurchases) {
  MeasuredWorld machine;
  EXPECT_EQ(runShow(machine.world, {.updateIndex = false}), ExitStatus::success);
  expectGolden("show.txt", machine.output());
  EXPECT_EQ(machine.errors(), "");
}

TEST(Show, FillsATerminalAndNoMore) {
  MeasuredWorld machine({.isTerminal = true, .hasColour = true, .hasUtf8 = true, .width = 60});
  runShow(machine.world, {.updateIndex = false});
  expectGolden("show-terminal.txt", machine.output());
}

TEST(Show, JsonHoldsEveryFigure) {
  MeasuredWorld machine;
  EXPECT_EQ(runShow(machine.world, {.updateIndex = false, .json = true}), ExitStatus::success);
  expectGolden("show.json", machine.output());
}

TEST(Show, JsonOfARefusedScanSaysWhy) {
  MeasuredWorld machine;
  machine.metadataIndex.volumes["/"].hasHealthCheck = false;
  EXPECT_EQ(runShow(machine.world, {.updateIndex = false, .json = true}), ExitStatus::failed);
  const auto document = nlohmann::json::parse(machine.output());
  EXPECT_EQ(document["volumes"], nlohmann::json::array());
  EXPECT_EQ(document["errors"][0]["reason"], "unfinished");
}

TEST(Show, WritesOnePageForItsOwnerAlone) {
  MeasuredWorld machine;
  const std::string path = machine.folder().path("page.html");
  EXPECT_EQ(writePage(machine, path), ExitStatus::success);
  expectGolden("page.html", contentOf(path));
  EXPECT_EQ(machine.output(), "Written: " + path + "\n");
  struct stat status {};
  ASSERT_EQ(::stat(path.c_str(), &status), 0);
  EXPECT_EQ(status.st_mode & 07777, 0600U);
}

TEST(Show, APageLoadsNothing) {
  MeasuredWorld machine;
  const std::string path = machine.folder().path("page.html");
  writePage(machine, path);
  for (const char* load : {"http:", "https:", "src=", "href=", "url(", "@import", "<script"})
    EXPECT_THAT(contentOf(path), Not(HasSubstr(load)));
}

TEST(Show, APageShowsTheNameOfAVolumeAndNoMarkupInIt) {
  MeasuredWorld machine;
  const std::string volume = "/media/<b>&\"\n\xff";
  machine.backupSettings.content->includedVolumes = {volume};
  machine.metadataIndex.volumes[volume] = {};
  machine.volumeCatalog.countsOfVolume[volume] = {};
  machine.resourceValues.capacities[volume] = {{ResourceKey::VolumeTotalCapacity, 10},
                                               {ResourceKey::VolumeAvailableCapacity, 5}};
  const std::string path = machine.folder().path("page.html");
  writePage(machine, path);
  EXPECT_THAT(contentOf(path), HasSubstr("<h3>/media/&lt;b&gt;&amp;&quot;\\n\\xFF</h3>"));
}

TEST(Show, LeavesTheOldPageAndMeasuresNothingWhereNoPageCanBeWritten) {
  MeasuredWorld machine;
  const std::string folder = machine.folder().path();
  for (const std::string& path : {folder, folder + "/missing/page.html", std::string("/dev/null")}) {
    EXPECT_EQ(writePage(machine, path), ExitStatus::failed);
    EXPECT_THAT(machine.errors(), HasSubstr("norvexctl: " + path + ": the page was not written: "));
  }
  EXPECT_TRUE(machine.metadataIndex.queries.empty());
}

TEST(Show, LeavesTheOldPageWhenTheScanIsRefused) {
  MeasuredWorld machine;
  machine.metadataIndex.volumes["/"].hasHealthCheck = false;
  const std::string path = machine.folder().path("page.html");
  std::ofstream(path) << "old";
  EXPECT_EQ(writePage(machine, path), ExitStatus::failed);
  EXPECT_EQ(contentOf(path), "old");
  const std::filesystem::directory_iterator files(machine.folder().path());
  EXPECT_EQ(std::distance(begin(files), end(files)), 1);
}

}  // namespace
}  // namespace norvex
