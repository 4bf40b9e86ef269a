#include "tool/CommandLine.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <sstream>

namespace norvex {
namespace {

struct Parsed {
  std::variant<CommandRequest, ExitStatus> outcome = ExitStatus::success;
  std::string out, err;
};

Parsed parse(std::vector<const char*> arguments) {
  arguments.insert(arguments.begin(), "norvexctl");
  std::ostringstream out, err;
  auto outcome = parseCommandLine(static_cast<int>(arguments.size()), arguments.data(), out, err);
  return {std::move(outcome), out.str(), err.str()};
}

TEST(CommandLine, ReadsEveryOptionOfAQuery) {
  const Parsed parsed =
      parse({"index", "query", "a == *", "--volume", "/", "--volume", "/home", "--count", "--json"});
  const auto& request = std::get<IndexQueryRequest>(std::get<CommandRequest>(parsed.outcome));
  EXPECT_EQ(request.predicate, "a == *");
  EXPECT_THAT(request.volumes, testing::ElementsAre("/", "/home"));
  EXPECT_TRUE(request.countOnly);
  EXPECT_TRUE(request.json);
  EXPECT_FALSE(request.nullSeparated);
}

TEST(CommandLine, TakesAPredicateBehindAVolume) {
  const Parsed parsed = parse({"index", "query", "--volume", "/", "a == *"});
  const auto& request = std::get<IndexQueryRequest>(std::get<CommandRequest>(parsed.outcome));
  EXPECT_EQ(request.predicate, "a == *");
  EXPECT_THAT(request.volumes, testing::ElementsAre("/"));
}

TEST(CommandLine, RefusesWhatMakesNoSense) {
  const std::vector<const char*> cases[] = {{},
                                            {"index"},
                                            {"nonsense"},
                                            {"index", "query"},
                                            {"index", "show"},
                                            {"index", "show", "/a", "/b"},
                                            {"index", "query", "a==1", "-0", "--json"},
                                            {"index", "status", "--nonsense"}};
  for (const auto& arguments : cases) {
    const Parsed parsed = parse(arguments);
    ASSERT_TRUE(std::holds_alternative<ExitStatus>(parsed.outcome));
    EXPECT_EQ(std::get<ExitStatus>(parsed.outcome), ExitStatus::usage);
    EXPECT_EQ(parsed.out, "");
    EXPECT_THAT(parsed.err, testing::StartsWith("norvexctl: "));
  }
}

TEST(CommandLine, UpdatesTheIndexBeforeAMeasurementUnlessToldNotTo) {
  const Parsed usual = parse({"preview"}), without = parse({"preview", "--no-index", "--json"});
  EXPECT_TRUE(std::get<PreviewRequest>(std::get<CommandRequest>(usual.outcome)).updateIndex);
  const auto& request = std::get<PreviewRequest>(std::get<CommandRequest>(without.outcome));
  EXPECT_FALSE(request.updateIndex);
  EXPECT_TRUE(request.json);
}

TEST(CommandLine, HelpOfEveryCommandHasAnExample) {
  const std::vector<const char*> cases[] = {{"--help"},
                                            {"index", "update", "--help"},
                                            {"index", "status", "--help"},
                                            {"index", "query", "--help"},
                                            {"index", "show", "--help"},
                                            {"preview", "--help"},
                                            {"agent", "--help"},
                                            {"agent", "status", "--help"},
                                            {"agent", "run", "--help"},
                                            {"agent", "enable", "--help"},
                                            {"agent", "disable", "--help"},
                                            {"doctor", "--help"},
                                            {"log", "--help"},
                                            {"show", "--help"},
                                            {"summary", "--help"}};
  for (const auto& arguments : cases) {
    const Parsed parsed = parse(arguments);
    EXPECT_EQ(std::get<ExitStatus>(parsed.outcome), ExitStatus::success);
    EXPECT_THAT(parsed.out, testing::HasSubstr("Example"));
    EXPECT_EQ(parsed.err, "");
  }
}

}  // namespace
}  // namespace norvex
