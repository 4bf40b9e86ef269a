#include "platform/linux/XdgFolders.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include "platform/linux/LinuxUserFolders.h"

namespace norvex {
namespace {

XdgFolders::HomeLookup databaseSays(std::optional<std::string> home) {
  return [home] { return home; };
}

TEST(XdgFolders, HomeIsTheFirstAbsoluteOneOfVariableAndDatabase) {
  struct Case {
    std::optional<std::string> variable;
    std::optional<std::string> database;
    std::string home;
  };
  const Case cases[] = {
      {"/home/ada", "/home/other", "/home/ada"},
      {"/home/ada///", "/home/other", "/home/ada"},
      {"/", "/home/other", "/"},
      {"home/ada", "/home/other", "/home/other"},
      {"", "/home/other/", "/home/other"},
      {std::nullopt, "/home/other", "/home/other"},
      {std::nullopt, "relative", "/nonexistent"},
      {std::nullopt, std::nullopt, "/nonexistent"},
  };
  for (const Case& row : cases) {
    Environment environment;
    if (row.variable) environment["HOME"] = *row.variable;
    EXPECT_EQ(XdgFolders::fromEnvironment(environment, databaseSays(row.database)).home, row.home)
        << row.variable.value_or("(unset)");
  }
}

TEST(XdgFolders, BaseFoldersHaveTheirUsualDefaults) {
  const XdgFolders folders = XdgFolders::fromEnvironment({{"HOME", "/home/ada"}});
  EXPECT_EQ(folders.config, "/home/ada/.config");
  EXPECT_EQ(folders.state, "/home/ada/.local/state");
  EXPECT_EQ(folders.cache, "/home/ada/.cache");
  EXPECT_EQ(folders.data, "/home/ada/.local/share");
}

TEST(XdgFolders, BelowTheRootAsHomeThereIsOneSeparator) {
  EXPECT_EQ(XdgFolders::fromEnvironment({{"HOME", "/"}}).config, "/.config");
}

TEST(XdgFolders, EachVariableMovesItsOwnFolder) {
  const XdgFolders folders = XdgFolders::fromEnvironment({{"HOME", "/home/ada"},
                                                          {"XDG_CONFIG_HOME", "/c/"},
                                                          {"XDG_STATE_HOME", "/s//"},
                                                          {"XDG_CACHE_HOME", "/k"},
                                                          {"XDG_DATA_HOME", "/"}});
  EXPECT_EQ(folders.config, "/c");
  EXPECT_EQ(folders.state, "/s");
  EXPECT_EQ(folders.cache, "/k");
  EXPECT_EQ(folders.data, "/");
}

TEST(XdgFolders, AVariableThatIsNotAbsoluteCountsAsNotSet) {
  for (const char* value : {"", "config", "./config", "~/config"}) {
    const XdgFolders folders =
        XdgFolders::fromEnvironment({{"HOME", "/home/ada"}, {"XDG_CONFIG_HOME", value}});
    EXPECT_EQ(folders.config, "/home/ada/.config") << value;
  }
}

TEST(XdgFolders, ThePasswordDatabaseKnowsTheUserOfTheProcess) {
  const std::optional<std::string> home = XdgFolders::homeInPasswordDatabase();
  if (!home) GTEST_SKIP() << "user " << ::getuid() << " is in no password database here";
  EXPECT_EQ(home->substr(0, 1), "/");
}

TEST(LinuxUserFolders, HomeIsThatOfTheFolders) {
  EXPECT_EQ(LinuxUserFolders(XdgFolders::fromEnvironment({{"HOME", "/home/ada/"}})).home(), "/home/ada");
}

TEST(Environment, HoldsWhatTheProcessWasStartedWith) {
  const char* path = ::getenv("PATH");
  if (path == nullptr) GTEST_SKIP() << "started without PATH";
  EXPECT_EQ(valueOf(processEnvironment(), "PATH"), path);
  EXPECT_EQ(valueOf(processEnvironment(), "NORVEX_NOBODY_SETS_THIS"), std::nullopt);
}

}  // namespace
}  // namespace norvex
