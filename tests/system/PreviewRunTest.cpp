// The real programs together: what the companion command says that would be reported is what the agent then
// reports.
#include <gtest/gtest.h>

#include <unistd.h>

#include <nlohmann/json.hpp>

#include "AgentWorld.h"
#include "OwnVolume.h"

namespace norvex {
namespace {

namespace fs = std::filesystem;
using nlohmann::json;

void fill(const fs::path& volume) {
  makeFile(volume / "music/song.mp3", 5'123'456);
  makeFile(volume / "pictures/photo.jpg", 3'210'987);
  makeFile(volume / "films/film.mkv", 40'000'000'001);
  makeFile(volume / "text/letter.pdf", 123'456);
  makeFile(volume / "machines/disk.qcow2", 9'876'543);
}

// The messages as the agent's log has them, without the moments at which they were written.
json reported(const AgentWorld& world) {
  json messages = json::array();
  for (const std::string& line : world.messages()) {
    json message = json::parse(line);
    message.erase("time");
    messages.push_back(std::move(message));
  }
  return messages;
}

// The same of a preview.
json previewed(const fs::path& file) {
  json messages = json::array();
  const json document = json::parse(AgentWorld::read(file).value_or(""));
  for (const json& message : document["messages"]) {
    json pairs = json::array();
    for (const json& pair : message["pairs"]) pairs.push_back({pair["key"], pair["reported"]});
    messages.push_back({{"domain", message["domain"]}, {"level", message["level"]}, {"pairs", pairs}});
  }
  return messages;
}

TEST(PreviewRun, ShowsWhatTheAgentThenReportsByteForByteAndSendsNothingItself) {
  AgentWorld world;
  const fs::path volume = world.root() / "volume", preview = world.root() / "preview.json";
  AgentWorld::write(
      world.backupSettingsFile(),
      "[Backup]\nAutomaticBackups=true\nDestinations=/a;/b\nIncludedVolumes=" + volume.string() + "\n");
  makeFile(world.home() / "Downloads/big.iso", 7'654'321);
  world.beforeExec = [&] {
    mountVolume(volume);
    fill(volume);
    if (const int status = runTool(world, {"preview", "--json"}, preview); status != 0) _exit(status);
    if (fs::exists(world.state() / "norvex") || fs::exists(world.preferenceFile())) _exit(70);
  };
  const int status = world.run({"--force"});
  if (status == kNotAllowed) GTEST_SKIP() << "mounting a file system of one's own is not allowed here";
  ASSERT_EQ(status, 0) << "70: the preview has left a message or the mark of a run";
  ASSERT_EQ(world.messages().size(), 2U);
  EXPECT_EQ(previewed(preview), reported(world));
}

TEST(LogRun, ShowsWhatTheAgentHasReported) {
  AgentWorld world;
  ASSERT_EQ(world.run({"--force"}), 0);
  const fs::path log = world.root() / "log.json";
  const pid_t process = fork();
  if (process == 0) _exit(runTool(world, {"log", "--json"}, log));
  ASSERT_EQ(AgentWorld::wait(process), 0);
  json shown = json::array();
  const json document = json::parse(AgentWorld::read(log).value_or(""));
  for (json message : document["messages"]) {
    EXPECT_EQ(message["source"], "file");
    message.erase("time");
    message.erase("source");
    shown.push_back(std::move(message));
  }
  EXPECT_EQ(shown, reported(world));
  EXPECT_EQ(shown.size(), 2U);
}

}  // namespace
}  // namespace norvex
