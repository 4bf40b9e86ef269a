#include "platform/linux/JsonPreferenceStore.h"

#include <fcntl.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <csignal>

#include "ChildProcess.h"
#include "ScratchFolder.h"
#include "StoredPreference.h"

namespace norvex {
namespace {

using testing::ElementsAre;

constexpr const char* kDamaged = "com.brixo.NorvexAgent.json.damaged";

TEST(PreferenceStore, ANumberOutlivesTheStore) {
  const ScratchFolder folder;
  EXPECT_EQ(stored(folder.path()), std::nullopt);
  store(folder.path(), 4);
  EXPECT_EQ(stored(folder.path()), 4.0);
  EXPECT_EQ(contentOf(folder.at(kFile)), "{\n  \"LastVersionRun\": 4\n}\n");
}

TEST(PreferenceStore, ANumberIsPendingUntilSynchronised) {
  const ScratchFolder folder;
  JsonPreferenceStore preferences(folder.path());
  preferences.setValue(kKey, 4, kDomain);
  EXPECT_EQ(preferences.copyValue(kKey, kDomain), 4.0);
  EXPECT_EQ(preferences.copyValue(kKey, "another"), std::nullopt);
  EXPECT_THAT(namesIn(folder.path()), ElementsAre());
  preferences.synchronize("another");
  EXPECT_THAT(namesIn(folder.path()), ElementsAre());
  preferences.synchronize(kDomain);
  EXPECT_THAT(namesIn(folder.path()), ElementsAre(kFile));
}

TEST(PreferenceStore, APendingNumberStandsBeforeTheStoredOne) {
  const ScratchFolder folder;
  store(folder.path(), 3);
  JsonPreferenceStore preferences(folder.path());
  preferences.setValue(kKey, 4, kDomain);
  EXPECT_EQ(preferences.copyValue(kKey, kDomain), 4.0);
  EXPECT_EQ(stored(folder.path()), 3.0);
}

TEST(PreferenceStore, WithoutAPendingNumberNothingIsWritten) {
  const ScratchFolder folder;
  const std::string content = "{ \"LastVersionRun\":3}";
  folder.write(kFile, content);
  JsonPreferenceStore preferences(folder.path());
  preferences.copyValue(kKey, kDomain);
  preferences.synchronize(kDomain);
  EXPECT_EQ(contentOf(folder.at(kFile)), content);
  preferences.setValue(kKey, 4, kDomain);
  preferences.synchronize(kDomain);
  folder.write(kFile, content);
  preferences.synchronize(kDomain);
  EXPECT_EQ(contentOf(folder.at(kFile)), content) << "a number is pending once";
}

TEST(PreferenceStore, OnlyANumberIsAValue) {
  struct Case {
    const char* content;
    std::optional<double> value;
  };
  const Case cases[] = {
      {R"({"LastVersionRun": 4})", 4.0},
      {R"({"LastVersionRun": 4.0})", 4.0},
      {R"({"LastVersionRun": 3.5})", 3.5},
      {R"({"LastVersionRun": -1})", -1.0},
      {R"({"LastVersionRun": 1e3})", 1000.0},
      {R"({"LastVersionRun": 18446744073709551615})", 18446744073709551615.0},
      {R"({"LastVersionRun": 3, "LastVersionRun": 4})", 4.0},
      {R"({"LastVersionRun": "4"})", std::nullopt},
      {R"({"LastVersionRun": true})", std::nullopt},
      {R"({"LastVersionRun": null})", std::nullopt},
      {R"({"LastVersionRun": [4]})", std::nullopt},
      {R"({"LastVersionRun": {"a": 4}})", std::nullopt},
      {R"({"Other": {"LastVersionRun": 4}})", std::nullopt},
      {R"({})", std::nullopt},
      {R"(4)", std::nullopt},
      {R"(["LastVersionRun", 4])", std::nullopt},
      {R"({"LastVersionRun": 4)", std::nullopt},
      {R"({"LastVersionRun": 4} x)", std::nullopt},
      {R"({"LastVersionRun": 1e999})", std::nullopt},
      {"{\"LastVersionRun\": 4, \"x\": \"\xff\"}", std::nullopt},
      {"", std::nullopt},
  };
  for (const Case& row : cases) {
    const ScratchFolder folder;
    folder.write(kFile, row.content);
    EXPECT_EQ(stored(folder.path()), row.value) << row.content;
  }
}

TEST(PreferenceStore, KeepsOtherKeysOfTheDomainInTheirOrder) {
  const ScratchFolder folder;
  folder.write(kFile,
               R"({"z": [1, {"b": 2.5, "a": null}], "LastVersionRun": "old", "a": "\u00e4", "m": -7})");
  JsonPreferenceStore preferences(folder.path());
  preferences.setValue("New", 1, kDomain);
  preferences.setValue(kKey, 4, kDomain);
  preferences.synchronize(kDomain);
  std::string content = contentOf(folder.at(kFile));
  std::erase_if(content, [](char character) { return character == ' ' || character == '\n'; });
  EXPECT_EQ(content, R"({"z":[1,{"b":2.5,"a":null}],"LastVersionRun":4,"a":"ä","m":-7,"New":1})");
}

TEST(PreferenceStore, DomainsDoNotTouchEachOther) {
  const ScratchFolder folder;
  JsonPreferenceStore preferences(folder.path());
  preferences.setValue(kKey, 1, "one");
  preferences.setValue(kKey, 2, "two");
  preferences.synchronize("one");
  EXPECT_THAT(namesIn(folder.path()), ElementsAre("one.json"));
  preferences.synchronize("two");
  EXPECT_EQ(JsonPreferenceStore(folder.path()).copyValue(kKey, "one"), 1.0);
  EXPECT_EQ(JsonPreferenceStore(folder.path()).copyValue(kKey, "two"), 2.0);
}

TEST(PreferenceStore, NoDomainLeadsOutOfTheFolder) {
  struct Case {
    std::string domain;
    const char* file;
  };
  const Case cases[] = {
      {"../escaped", "%2E.%2Fescaped.json"},
      {"/etc/passwd", "%2Fetc%2Fpasswd.json"},
      {"a/b", "a%2Fb.json"},
      {"..", "%2E..json"},
      {".hidden", "%2Ehidden.json"},
      {"", ".json"},
      {"a%2Fb", "a%252Fb.json"},
      {std::string("a\0b", 3), "a%00b.json"},
      {"A-b_c.9", "A-b_c.9.json"},
  };
  for (const Case& row : cases) {
    const ScratchFolder folder;
    JsonPreferenceStore preferences(folder.at("below"));
    preferences.setValue(kKey, 4, row.domain);
    preferences.synchronize(row.domain);
    EXPECT_THAT(namesIn(folder.path()), ElementsAre("below")) << row.domain;
    EXPECT_THAT(namesIn(folder.at("below")), ElementsAre(row.file));
    EXPECT_EQ(JsonPreferenceStore(folder.at("below")).copyValue(kKey, row.domain), 4.0);
  }
}

TEST(PreferenceStore, FilesAndFoldersAreForTheUserAlone) {
  const ScratchFolder folder;
  const mode_t before = ::umask(0);
  store(folder.at("config/norvex"), 4);
  ::umask(before);
  EXPECT_EQ(modeOf(folder.at("config")), 0700U);
  EXPECT_EQ(modeOf(folder.at("config/norvex")), 0700U);
  EXPECT_EQ(modeOf(folder.at("config/norvex/com.brixo.NorvexAgent.json")), 0600U);
}

TEST(PreferenceStore, KeepsADamagedFileBesideTheNewOne) {
  const std::string tooDeep = std::string(100'000, '[') + std::string(100'000, ']');
  const std::string tooLarge = "{\"x\": \"" + std::string(2'000'000, 'x') + "\"}";
  for (const std::string& damaged :
       {std::string("{\"LastVersionRun\": "), std::string(), std::string("[]"), tooDeep, tooLarge}) {
    const ScratchFolder folder;
    folder.write(kFile, damaged);
    folder.write(kDamaged, "an older one");
    EXPECT_EQ(stored(folder.path()), std::nullopt);
    EXPECT_EQ(contentOf(folder.at(kDamaged)), "an older one") << "reading moves nothing";
    store(folder.path(), 4);
    EXPECT_EQ(stored(folder.path()), 4.0);
    EXPECT_TRUE(contentOf(folder.at(kDamaged)) == damaged);
    EXPECT_THAT(namesIn(folder.path()), ElementsAre(kFile, kDamaged));
  }
}

TEST(PreferenceStore, WhatIsNoFileIsKeptAsDamaged) {
  const ScratchFolder folder;
  ASSERT_EQ(::mkfifo(folder.at(kFile).c_str(), 0600), 0);
  EXPECT_EQ(stored(folder.path()), std::nullopt);
  store(folder.path(), 4);
  EXPECT_EQ(stored(folder.path()), 4.0);
  EXPECT_TRUE(std::filesystem::is_fifo(folder.at(kDamaged)));
}

TEST(PreferenceStore, WritesALinkedFileWhereItLeadsTo) {
  const ScratchFolder folder;
  folder.write("dotfiles/norvex.json", R"({"Other": 1})");
  std::filesystem::create_directory(folder.at("config"));
  std::filesystem::create_symlink("../dotfiles/norvex.json", folder.at("config/") + kFile);
  store(folder.at("config"), 4);
  EXPECT_TRUE(std::filesystem::is_symlink(folder.at("config/") + kFile));
  EXPECT_EQ(JsonPreferenceStore(folder.at("config")).copyValue("Other", kDomain), 1.0);
  EXPECT_EQ(stored(folder.at("config")), 4.0);
  EXPECT_FALSE(std::filesystem::is_symlink(folder.at("dotfiles/norvex.json")));
  EXPECT_THAT(namesIn(folder.at("dotfiles")), ElementsAre("norvex.json"));
}

TEST(PreferenceStore, ReplacesALinkThatLeadsNowhere) {
  for (const char* target : {"missing", kFile}) {
    const ScratchFolder folder;
    std::filesystem::create_symlink(target, folder.at(kFile));
    EXPECT_EQ(stored(folder.path()), std::nullopt);
    store(folder.path(), 4);
    EXPECT_EQ(stored(folder.path()), 4.0) << target;
    EXPECT_FALSE(std::filesystem::is_symlink(folder.at(kFile)));
  }
}

TEST(PreferenceStore, RemovesWhatKilledWritersLeftAndNothingElse) {
  const ScratchFolder folder;
  folder.write(".com.brixo.NorvexAgent.json.unfinished-17", "{\"Las");
  folder.write(".com.brixo.NorvexAgent.json.unfinished-" + std::to_string(::getpid()), "{\"Las");
  folder.write(".other.json.unfinished-17", "x");
  folder.write("notes.txt", "mine");
  store(folder.path(), 4);
  EXPECT_THAT(namesIn(folder.path()), ElementsAre(".other.json.unfinished-17", kFile, "notes.txt"));
  EXPECT_EQ(stored(folder.path()), 4.0);
}

TEST(PreferenceStore, AFolderThatMayNotBeWrittenKeepsTheOldFile) {
  const ScratchFolder folder;
  folder.write(std::string("config/") + kFile, R"({"LastVersionRun": 3})");
  std::filesystem::permissions(folder.path(), std::filesystem::perms(0755));
  std::filesystem::permissions(folder.at("config"), std::filesystem::perms(0555));
  std::filesystem::permissions(folder.at("config/") + kFile, std::filesystem::perms(0444));
  const ChildEnd end = inChild([&]() -> std::string {
    if (!becomeUnprivileged()) return std::string(kImpossible) + "giving up root's rights";
    JsonPreferenceStore preferences(folder.at("config"));
    preferences.setValue(kKey, 4, kDomain);
    preferences.synchronize(kDomain);
    return preferences.copyValue(kKey, kDomain) == 4.0 ? "still pending" : "lost";
  });
  std::filesystem::permissions(folder.at("config"), std::filesystem::perms(0755));
  NORVEX_SKIP_IF_IMPOSSIBLE(end);
  EXPECT_EQ(end.report, "still pending");
  EXPECT_EQ(stored(folder.at("config")), 3.0);
  EXPECT_THAT(namesIn(folder.at("config")), ElementsAre(kFile));
}

TEST(PreferenceStore, AFileThatMayNotBeReadIsKeptAsDamaged) {
  const ScratchFolder folder;
  folder.write(kFile, R"({"LastVersionRun": 3})");
  std::filesystem::permissions(folder.at(kFile), std::filesystem::perms(0));
  std::filesystem::permissions(folder.path(), std::filesystem::perms(0777));
  const ChildEnd end = inChild([&]() -> std::string {
    if (!becomeUnprivileged()) return std::string(kImpossible) + "giving up root's rights";
    const std::string before = stored(folder.path()) ? "read" : "absent";
    store(folder.path(), 4);
    return before + ", " + (stored(folder.path()) == 4.0 ? "written" : "not written");
  });
  NORVEX_SKIP_IF_IMPOSSIBLE(end);
  EXPECT_EQ(end.report, "absent, written");
  EXPECT_THAT(namesIn(folder.path()), ElementsAre(kFile, kDamaged));
}

// Stores 3, then tries 4 while there is no room, then again when there is. Reports what was stored each time
// and the names of the files. The store holds enough besides to need room of its own.
std::string storeWithoutRoom(const std::string& folder, const std::function<void()>& fill,
                             const std::function<void()>& makeRoom) {
  std::ofstream(folder + "/" + kFile) << R"({"Other": ")" << std::string(20'000, 'x') << "\"}" << std::flush;
  JsonPreferenceStore preferences(folder);
  const auto state = [&] {
    std::string text;
    if (const std::optional<double> value = stored(folder)) text = std::to_string(static_cast<int>(*value));
    for (const std::string& name : namesIn(folder)) text += " " + name;
    return text + "; ";
  };
  preferences.setValue(kKey, 3, kDomain);
  preferences.synchronize(kDomain);
  std::string report = state();
  fill();
  preferences.setValue(kKey, 4, kDomain);
  preferences.synchronize(kDomain);
  report += state();
  makeRoom();
  preferences.synchronize(kDomain);
  return report + state();
}

TEST(PreferenceStore, AFullDiskKeepsTheOldFileAndTheNumberPending) {
  const ScratchFolder folder;
  const ChildEnd end = inChild([&] {
    if (const std::string problem = mountSmallDisk(folder.path(), "128k"); !problem.empty()) return problem;
    const std::string filler = folder.at("filler");
    return storeWithoutRoom(
        folder.path(), [&] { std::ofstream(filler) << std::string(1024 * 1024, 'f') << std::flush; },
        [&] { std::filesystem::remove(filler); });
  });
  NORVEX_SKIP_IF_IMPOSSIBLE(end);
  EXPECT_EQ(
      end.report,
      "3 com.brixo.NorvexAgent.json; 3 com.brixo.NorvexAgent.json filler; 4 com.brixo.NorvexAgent.json; ");
}

TEST(PreferenceStore, ALimitOnFilesKeepsTheOldFileAndTheNumberPending) {
  const ScratchFolder folder;
  const ChildEnd end = inChild([&] {
    ::signal(SIGXFSZ, SIG_IGN);
    const auto limitFiles = [](rlim_t bytes) {
      const rlimit limit{bytes, RLIM_INFINITY};
      ::setrlimit(RLIMIT_FSIZE, &limit);
    };
    return storeWithoutRoom(
        folder.path(), [&] { limitFiles(8192); }, [&] { limitFiles(RLIM_INFINITY); });
  });
  EXPECT_EQ(end.report,
            "3 com.brixo.NorvexAgent.json; 3 com.brixo.NorvexAgent.json; 4 com.brixo.NorvexAgent.json; ");
}

}  // namespace
}  // namespace norvex
