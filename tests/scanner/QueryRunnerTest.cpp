#include <gmock/gmock.h>

#include <fstream>
#include <limits>

#include "scanner/NVXScanner.h"
#include "tests/scanner/DebugLevelScope.h"
#include "tests/support/TestPlatform.h"

namespace norvex {
namespace {

using std::chrono::seconds;
using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::SizeIs;

const Location kVolume = Location::folder("/v");

// Runs one query; the paths that the handler was given, "(false)" when it did not start.
std::vector<std::string> search(const std::string& predicate = "p") {
  std::vector<std::string> paths;
  const bool started = NVXScanner().searchVolume(kVolume, predicate, [&](const MetadataResult& result) {
    paths.push_back(std::get<std::string>(*result.valueForAttribute(kMDItemPath)));
  });
  if (!started) paths.push_back("(false)");
  return paths;
}

TEST(SearchVolume, HandsOverEveryMatchOnceInTheIndexsOrder) {
  TestPlatform world;
  world.metadataIndex.volumes["/v"].matches["p"] = {{"/v/c"}, {"/v/a"}, {"/v/b"}, {"/v/a"}};
  EXPECT_THAT(search(), ElementsAre("/v/c", "/v/a", "/v/b", "/v/a"));
}

TEST(SearchVolume, IsTrueWithoutAMatch) {
  TestPlatform world;
  EXPECT_THAT(search(), IsEmpty());
  EXPECT_THAT(world.systemLog.lines, IsEmpty());
}

TEST(SearchVolume, SetsTheQueryUpInOrderAndTakesItDown) {
  TestPlatform world;
  search();
  EXPECT_THAT(world.calls.all(),
              ElementsAre("createQuery", "setPredicate p", "setValueListAttributes", "setSearchScopes",
                          "addFinishObserver", "startQuery p", "stopQuery", "removeFinishObserver"));
}

TEST(SearchVolume, AsksForOneAttributeOnOneVolume) {
  TestPlatform world;
  search("kMDItemX = 'y'");
  ASSERT_THAT(world.metadataIndex.queries, SizeIs(1));
  const QueryRecord& query = *world.metadataIndex.queries[0];
  EXPECT_EQ(query.predicate, "kMDItemX = 'y'");
  EXPECT_THAT(query.valueListAttributes, ElementsAre("kMDItemPurchaseDate"));
  ASSERT_THAT(query.scopes, SizeIs(1));
  EXPECT_EQ(query.scopes[0].urlText(), "file:///v/");
}

TEST(SearchVolume, ReadsTheCountAfreshBeforeEveryStep) {
  const struct {
    const char* claim;
    std::vector<std::size_t> counts;
    std::vector<std::string> handled;
    std::size_t reads;
  } rows[] = {
      {"a steady count", {}, {"/v/0", "/v/1", "/v/2"}, 4},
      {"a count that shrinks", {3, 1}, {"/v/0"}, 2},
      {"a count that grows", {1, 2}, {"/v/0", "/v/1", "/v/2"}, 4},
      {"a count that falls to zero", {3, 3, 0}, {"/v/0", "/v/1"}, 3},
      {"a count that starts at zero", {0}, {}, 1},
  };
  for (const auto& row : rows) {
    TestPlatform world;
    world.metadataIndex.volumes["/v"].matches["p"] = {{"/v/0"}, {"/v/1"}, {"/v/2"}};
    world.metadataIndex.countsShown = row.counts;
    EXPECT_EQ(search(), row.handled) << row.claim;
    EXPECT_EQ(world.metadataIndex.queries[0]->countReads, row.reads) << row.claim;
  }
}

TEST(SearchVolume, StopsTheQueryBeforeItHandsOver) {
  TestPlatform world;
  world.metadataIndex.volumes["/v"].matches["p"] = {{"/v/a"}};
  bool wasStopped = false;
  NVXScanner().searchVolume(
      kVolume, "p", [&](const MetadataResult&) { wasStopped = world.metadataIndex.queries[0]->stopped; });
  EXPECT_TRUE(wasStopped);
}

TEST(SearchVolume, HoldsOneResultAtATime) {
  TestPlatform world;
  world.metadataIndex.volumes["/v"].matches["p"] = std::vector<IndexedItem>(50, IndexedItem{"/v/a"});
  EXPECT_THAT(search(), SizeIs(50));
  EXPECT_EQ(world.metadataIndex.liveness->most, 1);
  EXPECT_EQ(world.metadataIndex.liveness->now, 0);
}

TEST(SearchVolume, LeavesNothingBehind) {
  TestPlatform world;
  world.metadataIndex.volumes["/v"].refused = {"refused"};
  search();
  search("refused");
  search();
  ASSERT_THAT(world.metadataIndex.queries, SizeIs(3));
  for (const auto& query : world.metadataIndex.queries) {
    EXPECT_EQ(query->observersAdded, 1);
    EXPECT_EQ(query->observersRemoved, 1);
    EXPECT_FALSE(query->alive);
  }
}

// --- the wait

TEST(SearchVolume, WaitsInPassesOfFiveSeconds) {
  TestPlatform world;
  world.metadataIndex.volumes["/v"].matches["p"] = {{"/v/a"}};
  world.metadataIndex.deferGathering = [&](EventLoop&, EventLoop::Input rest) {
    world.eventLoops.loop.postAfter(seconds(12), std::move(rest));
  };
  EXPECT_THAT(search(), ElementsAre("/v/a"));
  const auto& passes = world.eventLoops.loop.passes;
  ASSERT_THAT(passes, SizeIs(4));  // two in vain, one to gather, one to hand over
  for (const auto& pass : passes) EXPECT_EQ(pass.deadline - pass.begin, seconds(5));
  EXPECT_EQ(passes[2].begin - passes[0].begin, seconds(10));
}

TEST(SearchVolume, HasNoLimitToTheWait) {
  TestPlatform world;
  world.metadataIndex.volumes["/v"].matches["p"] = {{"/v/a"}};
  world.metadataIndex.deferGathering = [&](EventLoop&, EventLoop::Input rest) {
    world.eventLoops.loop.postAfter(std::chrono::hours(24), std::move(rest));
  };
  EXPECT_THAT(search(), ElementsAre("/v/a"));
}

TEST(SearchVolume, LeavesTheLoopAsSoonAsTheQueryIsStopped) {
  TestPlatform world;
  search();
  EXPECT_THAT(world.eventLoops.loop.passes, SizeIs(2));  // one to gather, one to hand over
}

TEST(SearchVolume, MakesNoPassWhenTheQueryIsStoppedAlready) {
  TestPlatform world;
  world.metadataIndex.volumes["/v"].matches["p"] = {{"/v/a"}};
  world.metadataIndex.deferGathering = [&](EventLoop& loop, EventLoop::Input rest) {
    // An index that is done before the start returns.
    rest();
    loop.runOnce(world.clock.now());
  };
  EXPECT_THAT(search(), ElementsAre("/v/a"));
  EXPECT_THAT(world.eventLoops.loop.passes, SizeIs(1));
}

TEST(SearchVolume, RunsOtherInputsOfTheLoopWhileItWaits) {
  TestPlatform world;
  bool ran = false;
  world.eventLoops.loop.post([&] { ran = true; });
  search();
  EXPECT_TRUE(ran);
}

// --- a query that does not start

TEST(SearchVolume, IsFalseSilentlyWhenTheQueryDoesNotStart) {
  TestPlatform world;
  world.metadataIndex.volumes["/v"].matches["p"] = {{"/v/a"}};
  world.metadataIndex.volumes["/v"].refused = {"p"};
  EXPECT_THAT(search(), ElementsAre("(false)"));
  EXPECT_THAT(world.systemLog.lines, IsEmpty());
  EXPECT_THAT(world.eventLoops.loop.passes, IsEmpty());
  EXPECT_THAT(world.calls.of({"startQuery", "stopQuery", "removeFinishObserver"}),
              ElementsAre("startQuery p", "removeFinishObserver"));
}

TEST(SearchVolume, SaysSoOnlyAtADebugLevelAboveZero) {
  const struct {
    std::int64_t level;
    std::size_t lines;
  } rows[] = {{0, 0}, {-1, 0}, {std::numeric_limits<std::int64_t>::min(), 0}, {1, 1}, {7, 1}};
  for (const auto& row : rows) {
    const DebugLevelScope level(row.level);
    TestPlatform world;
    world.metadataIndex.volumes["/v"].refused = {"p"};
    search();
    EXPECT_THAT(world.systemLog.lines, SizeIs(row.lines)) << row.level;
    world.systemLog.lines.clear();
    search("started");
    EXPECT_THAT(world.systemLog.lines, IsEmpty()) << row.level;
  }
}

// The line `number` of the scanner's source, counted from 1.
std::string sourceLine(int number) {
  std::ifstream source(NORVEX_SOURCE_DIR "/scanner/NVXScanner.cpp");
  std::string line;
  for (int i = 0; i < number; ++i) std::getline(source, line);
  return line;
}

TEST(SearchVolume, NamesTheLineOnWhichItLogs) {
  const DebugLevelScope level(1);
  TestPlatform world;
  world.metadataIndex.volumes["/v"].refused = {"p"};
  search();
  ASSERT_THAT(world.systemLog.lines, SizeIs(1));
  const std::string& logged = world.systemLog.lines[0];
  const std::string beginning = "5 Query failed to start | NVXScanner:";
  ASSERT_TRUE(logged.starts_with(beginning)) << logged;
  const std::string number = logged.substr(beginning.size());
  ASSERT_THAT(number, ::testing::MatchesRegex("[0-9]+"));
  EXPECT_THAT(sourceLine(std::stoi(number)), ::testing::HasSubstr("\"Query failed to start\""));
}

}  // namespace
}  // namespace norvex
