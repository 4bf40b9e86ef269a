#include "platform/Location.h"

#include <gtest/gtest.h>

namespace norvex {
namespace {

TEST(Location, PrintsAsAUrl) {
  const struct {
    Location location;
    const char* text;
  } rows[] = {
      {Location::folder("/"), "file:///"},
      {Location::file("/"), "file:///"},
      {Location::file("/a"), "file:///a"},
      {Location::folder("/a"), "file:///a/"},
      {Location::folder("/a/"), "file:///a/"},
      {Location::file("/a b%c"), "file:///a%20b%25c"},
      {Location::file("/AZaz09-._~"), "file:///AZaz09-._~"},
      {Location::file("/!*'();:@&=+$,?#[]"), "file:///%21%2A%27%28%29%3B%3A%40%26%3D%2B%24%2C%3F%23%5B%5D"},
      {Location::file("/\xC3\xA4\xFF\x01\x7F"), "file:///%C3%A4%FF%01%7F"},
      {Location::file("/a\n3 b"), "file:///a%0A3%20b"},
      {Location::file("//a//b"), "file:////a//b"},
      {Location(), "file://"},
  };
  for (const auto& row : rows) EXPECT_EQ(row.location.urlText(), row.text);
}

TEST(Location, AppendsBehindExactlyOneSeparator) {
  const struct {
    const char* base;
    const char* relative;
    const char* path;
  } rows[] = {{"/", "a", "/a"}, {"/a", "b", "/a/b"}, {"/a/", "b", "/a/b"}, {"/a", "b/c/", "/a/b/c/"}};
  for (const auto& row : rows) {
    for (const bool isFolder : {false, true}) {
      const Location appended = Location::folder(row.base).appending(row.relative, isFolder);
      EXPECT_EQ(appended.path(), row.path);
      EXPECT_EQ(appended.isFolder(), isFolder);
      EXPECT_FALSE(appended.facts().has_value());
    }
  }
}

TEST(Location, MadeFromAPathKnowsNothingOfTheItem) {
  EXPECT_FALSE(Location::file("/a").facts().has_value());
  EXPECT_FALSE(Location::folder("/a").facts().has_value());
}

TEST(Location, MovesFromItemToItemOfAFolder) {
  Location location = Location::folder("/t/");
  ItemFacts folder;
  folder.isDirectory = true;
  folder.isPackage = true;
  location.moveToItem(3, "a long name", folder);
  EXPECT_EQ(location.urlText(), "file:///t/a%20long%20name/");
  EXPECT_EQ(location.facts()->isPackage, true);

  ItemFacts file;
  file.totalFileSize = 9;
  location.moveToItem(3, "b", file);
  EXPECT_EQ(location.urlText(), "file:///t/b");
  EXPECT_EQ(location.facts()->totalFileSize, 9U);
  EXPECT_FALSE(location.facts()->isPackage.has_value());
}

TEST(Location, IsNoFolderWhenItsAttributesCouldNotBeRead) {
  Location location = Location::folder("/t/");
  ItemFacts facts;
  facts.isDirectory = true;
  facts.error = 13;
  location.moveToItem(3, "a", facts);
  EXPECT_FALSE(location.isFolder());
  EXPECT_EQ(location.facts()->error, 13);
}

TEST(Location, IsCopiedIndependently) {
  Location location = Location::folder("/t/");
  location.moveToItem(3, "a", {});
  const Location copy = location;
  location.moveToItem(3, "b", {});
  EXPECT_EQ(copy.path(), "/t/a");
}

TEST(NormalizedPath, IsResolvedByTextAlone) {
  const struct {
    const char* path;
    const char* normalized;
  } rows[] = {
      {"/", "/"},
      {"//", "/"},
      {"/a", "/a"},
      {"/a/", "/a"},
      {"/a//b///c", "/a/b/c"},
      {"/./a/./b/.", "/a/b"},
      {"/a/../b", "/b"},
      {"/a/b/..", "/a"},
      {"/..", "/"},
      {"/../a", "/a"},
      {"/a/../..", "/"},
      {"/.a/..b/...", "/.a/..b/..."},
      {"a/b", "a/b"},
      {"", ""},
      {"/a /b\xFF", "/a /b\xFF"},
  };
  for (const auto& row : rows) EXPECT_EQ(normalizedPath(row.path), row.normalized) << row.path;
}

TEST(NormalizedPath, StaysWhatItIs) {
  for (const char* path : {"/a//b/", "/x/../y", "/", "/.."}) {
    EXPECT_EQ(normalizedPath(normalizedPath(path)), normalizedPath(path)) << path;
  }
}

TEST(ExpandingTilde, ReplacesALeadingComponentAlone) {
  const struct {
    const char* path;
    const char* home;
    const char* expanded;
  } rows[] = {
      {"~", "/Users/user", "/Users/user"},
      {"~/", "/Users/user", "/Users/user/"},
      {"~/Music/Sonpix", "/Users/user", "/Users/user/Music/Sonpix"},
      {"~user/x", "/Users/user", "~user/x"},
      {"/a/~/b", "/Users/user", "/a/~/b"},
      {"~~", "/Users/user", "~~"},
      {"", "/Users/user", ""},
      {"/a", "/Users/user", "/a"},
      {"~/a", "/", "/a"},
      {"~", "/", "/"},
  };
  for (const auto& row : rows) EXPECT_EQ(expandingTilde(row.path, row.home), row.expanded) << row.path;
}

}  // namespace
}  // namespace norvex
