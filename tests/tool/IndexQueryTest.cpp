#include "tool/IndexQueryCommand.h"

#include <gtest/gtest.h>

#include <nlohmann/json.hpp>

#include "ToolTestWorld.h"

namespace norvex {
namespace {

using namespace std::string_literals;

constexpr const char* kSmall = "kMDItemFSSize < 10";

TEST(IndexQuery, WritesOnePathALineWithItsOwnBytesIntoAPipe) {
  ToolTestWorld tool;
  tool.index();
  EXPECT_EQ(runIndexQuery(tool.world, {kSmall, {tool.volume()}}), ExitStatus::success);
  EXPECT_EQ(tool.output(), "<volume>/sub/plain\n<volume>/sub/two\nlines\n");
}

TEST(IndexQuery, EscapesControlCharactersOnATerminal) {
  ConsoleStyle terminal;
  terminal.isTerminal = true;
  ToolTestWorld tool(terminal);
  tool.index();
  runIndexQuery(tool.world, {kSmall, {tool.volume()}});
  EXPECT_EQ(tool.output(), "<volume>/sub/plain\n<volume>/sub/two\\nlines\n");
}

TEST(IndexQuery, EndsPathsWithNulWhenAskedTo) {
  ConsoleStyle terminal;
  terminal.isTerminal = true;
  ToolTestWorld tool(terminal);
  tool.index();
  IndexQueryRequest request{kSmall, {tool.volume()}};
  request.nullSeparated = true;
  runIndexQuery(tool.world, request);
  EXPECT_EQ(tool.output(), "<volume>/sub/plain\0<volume>/sub/two\nlines\0"s);
}

TEST(IndexQuery, CountsWithoutListing) {
  ToolTestWorld tool;
  tool.index();
  IndexQueryRequest request{kSmall, {tool.volume()}};
  request.countOnly = true;
  runIndexQuery(tool.world, request);
  EXPECT_EQ(tool.output(), "2\n");
}

TEST(IndexQuery, JsonIsOneDocumentWhateverTheNames) {
  ToolTestWorld tool;
  tool.tree.add(".", {ondisk::file("caf\xe9", 1)});
  tool.index();
  IndexQueryRequest request{kSmall, {tool.volume()}};
  request.json = true;
  EXPECT_EQ(runIndexQuery(tool.world, request), ExitStatus::success);
  const auto document = nlohmann::json::parse(tool.outText.str());
  EXPECT_EQ(document["version"], 1);
  EXPECT_EQ(document["count"], 3);
  ASSERT_EQ(document["items"].size(), 3U);
  EXPECT_EQ(document["items"][0]["path"], tool.volume() + "/caf\xEF\xBF\xBD");
  EXPECT_TRUE(document["items"][0].contains("pathBytes"));
  EXPECT_EQ(document["items"][2]["path"], tool.volume() + "/sub/two\nlines");
  EXPECT_FALSE(document["items"][2].contains("pathBytes"));
}

TEST(IndexQuery, MarksTheColumnOfAPredicateThatMakesNoSense) {
  ToolTestWorld tool;
  EXPECT_EQ(runIndexQuery(tool.world, {"kMDItemFSSize >", {}}), ExitStatus::usage);
  EXPECT_EQ(tool.output(), "");
  EXPECT_EQ(tool.errors(),
            "norvexctl: the predicate makes no sense: column 16: expected a value (a string in quotes or a "
            "number), but the predicate ends there\n"
            "  kMDItemFSSize >\n"
            "                 ^\n");
}

TEST(IndexQuery, LooksThroughTheIncludedVolumesThatAreIndexed) {
  ToolTestWorld tool;
  tool.index();
  tool.include({"/not/indexed", tool.volume()});
  EXPECT_EQ(runIndexQuery(tool.world, {"kMDItemFSName == 'b.txt'", {}}), ExitStatus::success);
  EXPECT_EQ(tool.output(), "<volume>/b.txt\n");
  EXPECT_EQ(tool.errors(), "");
}

TEST(IndexQuery, FailsOverADamagedIndexAndSaysWhatToDo) {
  ToolTestWorld tool;
  tool.damage();
  EXPECT_EQ(runIndexQuery(tool.world, {kSmall, {tool.volume()}}), ExitStatus::failed);
  EXPECT_EQ(tool.errors(),
            "norvexctl: <volume>: its index <store> is damaged; make it anew with: norvexctl index update "
            "<volume>\n");
}

}  // namespace
}  // namespace norvex
