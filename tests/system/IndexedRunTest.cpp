// The real programs together: the index of a volume of its own is built, then the agent reports what is on
// it.
#include <gtest/gtest.h>
#include <sys/mount.h>
#include <unistd.h>

#include <nlohmann/json.hpp>

#include "AgentWorld.h"
#include "OwnVolume.h"
#include "results/NVXScannerResults.h"

namespace norvex {
namespace {

namespace fs = std::filesystem;
using nlohmann::json;

std::string valueOf(const json& message, const std::string& key) {
  for (const json& pair : message["pairs"]) {
    if (pair[0] == "com.brixo.message." + key) return pair[1];
  }
  return "(no such key)";
}

// Fills the volume, indexes it unless told not to, and goes on as the agent. The exit status of what went
// wrong first.
int runOverVolume(AgentWorld& world, const std::function<void(const fs::path&)>& fill) {
  const fs::path volume = world.root() / "volume";
  AgentWorld::write(world.backupSettingsFile(), "[Backup]\nIncludedVolumes=" + volume.string() + "\n");
  world.beforeExec = [&world, fill, volume] {
    mountVolume(volume);
    fill(volume);
    if (const int status = runTool(world, {"index", "update"}); status != 0) _exit(status);
  };
  return world.run({"--force"});
}

TEST(IndexedRun, ReportsCategoriesMediaAndCountsOfTheVolume) {
  AgentWorld world;
  const int status = runOverVolume(world, [](const fs::path& volume) {
    makeFile(volume / "music/song.mp3", 5'000'000);
    makeFile(volume / "pictures/photo.jpg", 3'000'000);
    makeFile(volume / "Viewer.app/Contents/Resources/icon.png", 20'000);
    makeFile(volume / "films/film.mkv", 40'000'000'000);
    makeFile(volume / "text/letter.pdf", 100'000);
    makeFile(volume / "phone/game.ipa", 7'000'000);
    makeFile(volume / "machines/disk.qcow2", 9'000'000);
    AgentWorld::write(volume / "cache/CACHEDIR.TAG", "Signature: 8a477f597d28d172789f06886806bc55\n");
    makeFile(volume / "cache/blob", 2'000'000);
  });
  if (status == kNotAllowed) GTEST_SKIP() << "mounting a file system of one's own is not allowed here";
  ASSERT_EQ(status, 0);

  const json sizes = json::parse(world.messages().at(0));
  const auto bucket = NVXScannerResults::bucketedStringFromSize;
  const std::vector<std::pair<const char*, std::uint64_t>> rows = {
      {"music_size", 5'000'000},
      {"movies_size", 40'000'000'000},
      {"images_size", 3'000'000},
      {"apps_size", 7'020'000},
      {"documents_size", 100'000},
      {"images_in_application_bundles_size", 20'000},
      {"images_in_other_locations_size", 3'020'000},
      {"music_in_other_locations_size", 5'000'000},
      {"movies_in_other_locations_size", 40'000'000'000},
      {"kyt_apps_size", 7'000'000},
      {"virtual_machines_size", 9'000'000},
      {"chronel_sticky_exclusion_size", 2'000'044},
      {"startup_disk_music_size", 0},
  };
  for (const auto& [key, size] : rows) EXPECT_EQ(valueOf(sizes, key), bucket(size)) << key;

  const json counts = json::parse(world.messages().at(1));
  EXPECT_EQ(valueOf(counts, "all_disks_total_files_count"), "9");
  EXPECT_EQ(valueOf(counts, "all_disks_total_directories_count"), "10");
}

TEST(IndexedRun, AVolumeWhoseFirstUpdateWasInterruptedKeepsTheAgentFromReporting) {
  AgentWorld world;
  const fs::path volume = world.root() / "volume";
  AgentWorld::write(world.backupSettingsFile(), "[Backup]\nIncludedVolumes=" + volume.string() + "\n");
  world.beforeExec = [&world, volume] {
    mountVolume(volume);
    for (int i = 0; i < 20'000; ++i) AgentWorld::write(volume / ("f" + std::to_string(i)), "");
    // Without room for the finished index the update fails and leaves the empty one.
    const fs::path cache = world.root() / "cache";
    if (mount("tmpfs", cache.c_str(), "tmpfs", 0, "size=192k") != 0) _exit(kNotAllowed);
    if (runTool(world, {"index", "update"}) == 0) _exit(70);
  };
  const int status = world.run({"--force"});
  if (status == kNotAllowed) GTEST_SKIP() << "mounting a file system of one's own is not allowed here";
  ASSERT_EQ(status, 0) << "70: the update has found room";
  EXPECT_TRUE(world.messages().empty());
  EXPECT_FALSE(fs::exists(world.preferenceFile()));
}

}  // namespace
}  // namespace norvex
