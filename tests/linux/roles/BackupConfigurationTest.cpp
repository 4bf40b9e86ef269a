#include "platform/linux/BackupConfiguration.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace norvex {
namespace {

using testing::ElementsAre;

BackupConfiguration parsed(std::string_view text) {
  const auto outcome = parseBackupConfiguration(text);
  if (const auto* fault = std::get_if<BackupConfigurationFault>(&outcome)) {
    ADD_FAILURE() << text << "\nline " << fault->line << ": " << fault->what;
    return {};
  }
  return std::get<BackupConfiguration>(outcome);
}

TEST(BackupConfiguration, ReadsAllItsKeys) {
  const BackupConfiguration all = parsed(
      "# The backup feature.\n; Two kinds of comments.\n\n[Backup]\nAutomaticBackups=true\n"
      "SkipSystemFiles=TRUE\nDestinations=/media/backup;ssh://nas/backups\nIncludedVolumes=/;/home\n");
  EXPECT_TRUE(all.automaticBackups);
  EXPECT_TRUE(all.skipSystemFiles);
  EXPECT_THAT(all.destinations, ElementsAre("/media/backup", "ssh://nas/backups"));
  ASSERT_TRUE(all.includedVolumes.has_value());
  EXPECT_THAT(*all.includedVolumes, ElementsAre("/", "/home"));
}

TEST(BackupConfiguration, MissingKeysHaveTheirDefaults) {
  for (const char* text : {"", "\n\n", "[Backup]", "[Backup]\n", "# nothing\n"}) {
    const BackupConfiguration defaults = parsed(text);
    EXPECT_FALSE(defaults.automaticBackups);
    EXPECT_FALSE(defaults.skipSystemFiles);
    EXPECT_THAT(defaults.destinations, ElementsAre());
    EXPECT_FALSE(defaults.includedVolumes.has_value()) << "auto";
  }
}

TEST(BackupConfiguration, VolumesAreAutomaticNoneOrAsWritten) {
  struct Case {
    const char* value;
    std::optional<std::vector<std::string>> volumes;
  };
  using List = std::vector<std::string>;
  const Case cases[] = {
      {"auto", std::nullopt},
      {"  auto\t", std::nullopt},
      {"", List{}},
      {" ; ;", List{}},
      {"/", List{"/"}},
      {" / ;\t/home ; ;/srv/my data;", List{"/", "/home", "/srv/my data"}},
      {"/home/;../x;\"/quoted\"", List{"/home/", "../x", "\"/quoted\""}},
      {"/home;/home", List{"/home", "/home"}},
      {"auto;/home", List{"auto", "/home"}},
      {"AUTO", List{"AUTO"}},
      {"/a=b # no comment", List{"/a=b # no comment"}},
  };
  for (const Case& row : cases) {
    EXPECT_EQ(parsed(std::string("[Backup]\nIncludedVolumes=") + row.value).includedVolumes, row.volumes)
        << row.value;
  }
}

TEST(BackupConfiguration, BlanksAroundKeysAndValuesMeanNothing) {
  EXPECT_TRUE(parsed("  [Backup] \r\n\tAutomaticBackups \t=  True \r\n").automaticBackups);
}

TEST(BackupConfiguration, KnowsItsKeysInItsSectionOnly) {
  const char* const texts[] = {
      "AutomaticBackups=true\n",
      "[Other]\nAutomaticBackups=true\n",
      "[backup]\nAutomaticBackups=true\n",
      "[Backup]\nautomaticbackups=true\nAutomaticBackups2=true\n",
      "[Backup]\n[Other]\nAutomaticBackups=perhaps\n",
  };
  for (const char* text : texts) EXPECT_FALSE(parsed(text).automaticBackups) << text;
  EXPECT_TRUE(parsed("[Other]\nx=y\n[Backup]\nColour=\nAutomaticBackups=true\n").automaticBackups);
}

TEST(BackupConfiguration, OfAKeyThatStandsTwiceTheLastOneHolds) {
  const BackupConfiguration last = parsed(
      "[Backup]\nAutomaticBackups=true\nAutomaticBackups=false\nDestinations=/a;/b\nDestinations=/c\n"
      "IncludedVolumes=/x\nIncludedVolumes=auto\n");
  EXPECT_FALSE(last.automaticBackups);
  EXPECT_THAT(last.destinations, ElementsAre("/c"));
  EXPECT_FALSE(last.includedVolumes.has_value());
}

TEST(BackupConfiguration, NamesTheFirstLineThatIsMalformed) {
  struct Case {
    const char* text;
    std::size_t line;
    const char* what;
  };
  const Case cases[] = {
      {"Backup\n", 1, "neither [section] nor key=value"},
      {"[Backup]\n\n# comment\nAutomaticBackups\n", 4, "neither [section] nor key=value"},
      {"[Backup\n", 1, "section without ]"},
      {"[", 1, "section without ]"},
      {"[Backup] x\n", 1, "section without ]"},
      {"[Backup]\n=true\n", 2, "value without a key"},
      {"[Backup]\nAutomaticBackups=\n", 2, "AutomaticBackups is neither true nor false"},
      {"[Backup]\nAutomaticBackups=yes\n", 2, "AutomaticBackups is neither true nor false"},
      {"[Backup]\nSkipSystemFiles=true false\nnonsense", 2, "SkipSystemFiles is neither true nor false"},
      {"[Backup]\nAutomaticBackups=1\nAutomaticBackups=true", 2,
       "AutomaticBackups is neither true nor false"},
      {"\xef\xbb\xbf[Backup]\n", 1, "neither [section] nor key=value"},
      {"[Other]\nnonsense", 2, "neither [section] nor key=value"},
  };
  for (const Case& row : cases) {
    const auto outcome = parseBackupConfiguration(row.text);
    const auto* fault = std::get_if<BackupConfigurationFault>(&outcome);
    ASSERT_NE(fault, nullptr) << row.text;
    EXPECT_EQ(fault->line, row.line) << row.text;
    EXPECT_EQ(fault->what, row.what) << row.text;
  }
}

}  // namespace
}  // namespace norvex
