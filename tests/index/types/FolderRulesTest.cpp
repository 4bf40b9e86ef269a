#include "index/FolderRules.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace norvex {
namespace {

using testing::ElementsAre;

struct NameCase {
  std::string_view name;
  bool expected;
};

TEST(FolderRules, ApplicationsAreKnownByTheirEndingInAnyCase) {
  constexpr NameCase cases[] = {
      {"Viewer.app", true},
      {"Viewer.APP", true},
      {"Viewer.AppDir", true},
      {"Viewer.appdir", true},
      {"Viewer.apps", false},
      {"Viewer", false},
      {"app", false},
      {"Viewer.app.old", false},
      {"Viewer.bundle", false},
      {"Viewer.plugin", false},
      {"", false},
  };
  for (const NameCase& each : cases) {
    EXPECT_EQ(isApplicationBundleName(each.name), each.expected) << each.name;
  }
}

TEST(FolderRules, FlatpakHasAnInstallationOfTheSystemAndOneOfTheUser) {
  EXPECT_THAT(flatpakInstallations("/home/user/.local/share"),
              ElementsAre("/var/lib/flatpak", "/home/user/.local/share/flatpak"));
}

TEST(FolderRules, ADeploymentIsOneFolderBelowAppOfAnInstallation) {
  const auto installations = flatpakInstallations("/home/user/.local/share");
  constexpr NameCase cases[] = {
      {"/var/lib/flatpak/app/org.example.Draw", true},
      {"/home/user/.local/share/flatpak/app/org.example.Draw", true},
      {"/var/lib/flatpak/app", false},
      {"/var/lib/flatpak/app/", false},
      {"/var/lib/flatpak/app/org.example.Draw/x86_64", false},
      {"/var/lib/flatpak/runtime/org.example.Platform", false},
      {"/var/lib/flatpak/apps/org.example.Draw", false},
      {"/var/lib/flatpak2/app/org.example.Draw", false},
      {"/srv/var/lib/flatpak/app/org.example.Draw", false},
      {"/home/other/.local/share/flatpak/app/org.example.Draw", false},
      {"", false},
  };
  for (const NameCase& each : cases) {
    EXPECT_EQ(isFlatpakDeployment(each.name, installations), each.expected) << each.name;
  }
}

struct SnapCase {
  std::string_view folder;
  std::string_view name;
  bool expected;
};

TEST(FolderRules, ASnapIsInstalledOnlyWhereTheSystemKeepsThem) {
  constexpr SnapCase cases[] = {
      {"/var/lib/snapd/snaps", "draw_12.snap", true},
      {"/var/lib/snapd/snaps", "draw_12.SNAP", true},
      {"/var/lib/snapd/snaps", "draw_12.snap.part", false},
      {"/var/lib/snapd/snaps", "snap", false},
      {"/var/lib/snapd/snaps/partial", "draw_12.snap", false},
      {"/var/lib/snapd", "draw_12.snap", false},
      {"/home/user", "draw_12.snap", false},
      {"/srv/var/lib/snapd/snaps", "draw_12.snap", false},
  };
  for (const SnapCase& each : cases) {
    EXPECT_EQ(isInstalledSnap(each.folder, each.name), each.expected) << each.folder << '/' << each.name;
  }
}

TEST(FolderRules, AMaildirHasAllThreeFolders) {
  struct Case {
    std::vector<std::string_view> folders;
    bool isMaildir;
  };
  const std::vector<Case> cases = {
      {{"cur", "new", "tmp"}, true},  {{"tmp", "x", "new", "cur"}, true}, {{"cur", "new"}, false},
      {{"cur", "cur", "cur"}, false}, {{"Cur", "new", "tmp"}, false},     {{}, false},
  };
  for (const Case& each : cases) {
    MaildirSigns signs;
    for (const std::string_view folder : each.folders) signs.seeFolder(folder);
    EXPECT_EQ(signs.isMaildir(), each.isMaildir) << testing::PrintToString(each.folders);
  }
}

TEST(FolderRules, MessagesLieInCurAndNewOnly) {
  constexpr NameCase cases[] = {{"cur", true}, {"new", true}, {"tmp", false}, {"CUR", false}, {"", false}};
  for (const NameCase& each : cases) EXPECT_EQ(isMaildirMessageFolder(each.name), each.expected) << each.name;
}

constexpr std::string_view signature = "Signature: 8a477f597d28d172789f06886806bc55";

struct TagCase {
  std::string_view claim;
  CacheTag tag;
  bool expected;
};

TEST(FolderRules, ACacheTagHasItsSignatureAtItsVeryBeginning) {
  const std::string longer = std::string(signature) + "\n# made by a program\n";
  const std::string shifted = " " + std::string(signature);
  const std::string capitals = "Signature: 8A477F597D28D172789F06886806BC55";
  const TagCase cases[] = {
      {"the signature alone", {true, false, signature}, true},
      {"with more behind it", {true, false, longer}, true},
      {"too short", {true, false, signature.substr(0, 42)}, false},
      {"empty", {true, false, ""}, false},
      {"not at the beginning", {true, false, shifted}, false},
      {"other case", {true, false, capitals}, false},
      {"no regular file", {false, false, signature}, false},
      {"in the root of the volume", {true, true, signature}, false},
  };
  for (const TagCase& each : cases) EXPECT_EQ(isValidCacheTag(each.tag), each.expected) << each.claim;
}

TEST(FolderRules, AFolderRefusesBackupWithTheWordFalse) {
  using namespace std::string_view_literals;
  constexpr NameCase cases[] = {
      {"false", true},   {"false\n", true}, {"false\0"sv, true}, {"false\n\n", false}, {"False", false},
      {" false", false}, {"true", false},   {"0", false},        {"", false},
  };
  for (const NameCase& each : cases) EXPECT_EQ(refusesBackup(each.name), each.expected) << each.name;
}

}  // namespace
}  // namespace norvex
