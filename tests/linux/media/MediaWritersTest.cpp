// The reader against files that other programs wrote, and against what those say is in them.
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <nlohmann/json.hpp>
#include <string>
#include <utility>
#include <vector>

#include "media/Boxes.h"
#include "media/TempFolder.h"
#include "platform/linux/Mpeg4MediaReader.h"

namespace norvex {
namespace {

using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Not;
using testing::SizeIs;

// Runs a program without its output and without a shell; its exit status, or -1.
int run(const std::vector<std::string>& command) {
  std::vector<char*> arguments;
  for (const auto& word : command) arguments.push_back(const_cast<char*>(word.c_str()));
  arguments.push_back(nullptr);
  const pid_t child = ::fork();
  if (child == 0) {
    if (std::freopen("/dev/null", "w", stdout) == nullptr) ::_exit(127);
    if (std::freopen("/dev/null", "w", stderr) == nullptr) ::_exit(127);
    ::execvp(arguments[0], arguments.data());
    ::_exit(127);
  }
  int status = 0;
  if (child < 0 || ::waitpid(child, &status, 0) != child || !WIFEXITED(status)) return -1;
  return WEXITSTATUS(status);
}

std::vector<std::string> keysOf(const std::string& path) {
  Mpeg4MediaReader reader;
  return shown(reader.itemKeys(Location::file(path)));
}

// A tagged file whose movie stands before the media data, or behind it.
std::string makeSong(const TempFolder& folder, bool movieFirst) {
  const std::string root = folder / (movieFirst ? "head" : "tail");
  const std::string path = root + ".m4a";
  const int status =
      run({"python3", NORVEX_SOURCE_DIR "/scripts/make-media", root, "--files", "40", "--length", "0.01"});
  EXPECT_EQ(status, 0);
  std::ifstream manifest(root + "/manifest.jsonl");
  for (std::string line; std::getline(manifest, line);) {
    const auto entry = nlohmann::json::parse(line);
    const std::string name = entry.at("path");
    if (entry.at("layout") != (movieFirst ? "head" : "tail") || !name.ends_with(".m4a")) continue;
    std::filesystem::copy_file(root + "/" + name, path);
    break;
  }
  return path;
}

// --- make-media, which says in a manifest what it wrote

// "©" is a byte of its own in a key and two in the manifest.
std::string inManifestWords(const std::string& key) {
  if (key.front() == '"') return "----:" + key.substr(1, key.size() - 2);
  return key.front() == '\xA9' ? "\xC2\xA9" + key.substr(1) : key;
}

TEST(MediaWriters, MakeMediaHasWrittenWhatIsReadAndNothingIsReadOfItsDamagedFiles) {
  const TempFolder folder;
  const std::string root = folder / "made";
  ASSERT_EQ(run({"python3", NORVEX_SOURCE_DIR "/scripts/make-media", root, "--files", "300", "--length",
                 "0.02", "--broken", "20"}),
            0);
  std::ifstream manifest(root + "/manifest.jsonl");
  int whole = 0;
  int damaged = 0;
  for (std::string line; std::getline(manifest, line);) {
    const auto entry = nlohmann::json::parse(line);
    std::vector<std::string> keys = keysOf(root + "/" + entry.at("path").get<std::string>());
    for (auto& key : keys) key = inManifestWords(key);
    if (entry.contains("keys")) {
      ++whole;
      EXPECT_EQ(keys, entry.at("keys").get<std::vector<std::string>>()) << line;
    } else {
      ++damaged;
      EXPECT_THAT(keys, IsEmpty()) << line;
    }
  }
  EXPECT_GT(whole, 200);
  EXPECT_GT(damaged, 30);
}

// --- files that ffmpeg and mutagen once wrote

TEST(MediaWriters, OtherProgramsHaveWrittenTheKeysThatAreRead) {
  const std::vector<std::string> ffmpegWrites = {"\xA9nam",
                                                 "\xA9"
                                                 "ART",
                                                 "\xA9too"};
  const std::vector<std::pair<std::string, std::vector<std::string>>> files = {
      {"movie-last.m4a", ffmpegWrites},
      {"movie-first.m4a", ffmpegWrites},
      {"fragments.mp4", ffmpegWrites},
      {"numbered-keys.mp4", {bigEndianText(1, 4), bigEndianText(2, 4), bigEndianText(3, 4)}},
      {"quicktime.mov", {}},
      {"retagged.m4a",
       {"\xA9nam",
        "\xA9"
        "ART",
        "\xA9too", "\"org.example:MOOD\"", "covr", "purd"}},
  };
  for (const auto& [name, keys] : files) {
    EXPECT_EQ(keysOf(NORVEX_SOURCE_DIR "/tests/linux/media/files/" + name), keys) << name;
  }
}

// --- AtomicParsley, a tagging program of others

class AtomicParsley : public testing::TestWithParam<bool> {
 protected:
  void SetUp() override {
    if (run({"AtomicParsley", "--version"}) != 0) GTEST_SKIP() << "AtomicParsley is not installed";
  }

  // Has the program write `to` with the tags of `from` and those of `options`.
  static void tag(const std::string& from, const std::string& to, std::vector<std::string> options) {
    options.insert(options.begin(), {"AtomicParsley", from});
    options.insert(options.end(), {"--output", to});
    ASSERT_EQ(run(options), 0);
  }
};

TEST_P(AtomicParsley, HasWrittenTheKeysThatAreRead) {
  const TempFolder folder;
  const std::string tagged = folder / "tagged.m4a";
  const std::string song = makeSong(folder, GetParam());
  const std::string bare = folder / "bare.m4a";
  tag(song, bare, {"--metaEnema"});
  EXPECT_THAT(keysOf(bare), IsEmpty());

  tag(bare, tagged,
      {"--title", "A title", "--artist", "An artist", "--tracknum", "1/2", "--rDNSatom", "calm", "name=MOOD",
       "domain=org.example", "--purchaseDate", "timestamp", "--comment", "A comment"});
  EXPECT_THAT(keysOf(tagged), ElementsAre("\xA9nam",
                                          "\xA9"
                                          "ART",
                                          "trkn", "\"org.example:MOOD\"", "purd",
                                          "\xA9"
                                          "cmt"));
}

TEST_P(AtomicParsley, HasAddedAndTakenAwayAPurchaseDate) {
  const TempFolder folder;
  const std::string song = makeSong(folder, GetParam());
  const std::string without = folder / "without.m4a";
  const std::string with = folder / "with.m4a";
  tag(song, without, {"--purchaseDate", "", "--title", "A title"});
  tag(without, with, {"--purchaseDate", "timestamp"});
  EXPECT_THAT(keysOf(without), Not(Contains("purd")));
  EXPECT_THAT(keysOf(with), Contains("purd"));
  EXPECT_THAT(keysOf(with), SizeIs(keysOf(without).size() + 1));
}

INSTANTIATE_TEST_SUITE_P(MediaWriters, AtomicParsley, testing::Bool(), [](const auto& place) {
  return std::string(place.param ? "MovieFirst" : "MovieLast");
});

}  // namespace
}  // namespace norvex
