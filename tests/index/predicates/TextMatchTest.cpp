#include "index/TextMatch.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace norvex {
namespace {

constexpr TextFolding kExact{};
constexpr TextFolding kAnyCase{true, false};
constexpr TextFolding kAnyMark{false, true};
constexpr TextFolding kAnyBoth{true, true};

struct MatchRow {
  std::string source;
  TextFolding folding;
  std::string text;
  bool matches;
};

void check(const std::vector<MatchRow>& rows) {
  for (const auto& row : rows) {
    EXPECT_EQ(TextMatcher(patternFromSource(row.source, row.folding)).matches(row.text), row.matches)
        << row.source << " on " << row.text << (row.folding.ignoresCase ? " c" : "")
        << (row.folding.ignoresDiacritics ? " d" : "");
  }
}

TEST(TextPattern, ReadsWildcardsAndEscapes) {
  const std::vector<std::pair<std::string, std::vector<std::string>>> rows{
      {"", {""}},
      {"abc", {"abc"}},
      {"*", {"", ""}},
      {"a*b", {"a", "b"}},
      {"a**", {"a", "", ""}},
      {R"(a\*b)", {"a*b"}},
      {R"(\\*)", {"\\", ""}},
      {R"(\'\"\n)", {"'\"n"}},
      {"end\\", {"end\\"}},
  };
  for (const auto& [source, pieces] : rows)
    EXPECT_EQ(patternFromSource(source, kExact).pieces, pieces) << source;
}

TEST(TextPattern, ComesBackFromItsSource) {
  for (const std::string source : {"", "*", "a*b", R"(a\*\\b*)", "**", "\xff*"}) {
    const auto pattern = patternFromSource(source, kAnyCase);
    EXPECT_EQ(patternFromSource(sourceOfPattern(pattern), kAnyCase), pattern) << source;
  }
}

TEST(TextMatcher, AWildcardStandsForAnyBytes) {
  check({
      {"*", kExact, "", true},
      {"*", kExact, "\xff\n", true},
      {"a*", kExact, "a", true},
      {"a*", kExact, "ba", false},
      {"*a", kExact, "ba", true},
      {"*a", kExact, "ab", false},
      {"*a*", kExact, "xaz", true},
      {"a*a", kExact, "a", false},  // one byte cannot be both ends
      {"a*a", kExact, "aa", true},
      {"a*b*c", kExact, "a-b-b-c", true},
      {"a*b*c", kExact, "a-c-b", false},
      {"*ab*ab*", kExact, "abab", true},
      {"*ab*ab*", kExact, "abb", false},
      {"*ab*bc", kExact, "abc", false},
      {"a**b", kExact, "ab", true},
      {R"(\*)", kExact, "*", true},
      {R"(\*)", kExact, "x", false},
      {R"(100\%*)", kExact, "100% sure", true},
      {"*\xc3\xa9*", kExact, "caf\xc3\xa9s", true},
      {"*\xa9", kExact, "caf\xc3\xa9", true},  // bytes, not characters
  });
}

TEST(TextMatcher, IgnoresCaseOnlyWhenAsked) {
  check({
      {"IMG_*.jpg", kExact, "img_1.JPG", false},
      {"IMG_*.jpg", kAnyCase, "img_1.JPG", true},
      {"STRASSE", kAnyCase, "straße", true},
      {"ΣΊΣΥΦΟΣ", kAnyCase, "σίσυφος", true},  // the final sigma is a sigma
      {"ÉTÉ", kAnyCase, "été", true},
      {"ÉTÉ", kAnyCase, "ete", false},
      {"e*", kAnyCase, "école", false},        // composed
      {"e*", kAnyCase, "e\u0301cole", false},  // the same word, stored with a separate mark
      {"é*", kAnyCase, "E\u0301cole", true},
      {"é", kExact, "e\u0301", false},
  });
}

TEST(TextMatcher, IgnoresDiacriticsOnlyWhenAsked) {
  check({
      {"ecole", kAnyMark, "école", true},
      {"ecole", kAnyMark, "e\u0301cole", true},
      {"école", kAnyMark, "ecole", true},
      {"ecole", kAnyMark, "École", false},
      {"ecole", kAnyBoth, "École", true},
      {"*nguyen*", kAnyBoth, "Trần NGUYỄN 2", true},
      {"orsted", kAnyBoth, "Ørsted", false},  // a letter of its own
  });
}

TEST(TextMatcher, KeepsBytesThatAreNoText) {
  check({
      {"\xff\xfe", kExact, "\xff\xfe", true},
      {"\xff*", kAnyBoth, "\xff\x41", true},
      {"\xff"
       "A",
       kAnyCase,
       "\xff"
       "a",
       true},
      {"\xff", kAnyBoth, "\xfe", false},
      {"\xc3", kAnyBoth, "\xc3\xa9", false},
      {std::string("a\0b", 3), kAnyCase, std::string("A\0B", 3), true},
      {std::string("a\0b", 3), kExact, "a", false},
  });
}

TEST(TextMatcher, TakesMarksInAnyOrderAndNumber) {
  const std::string above = "\u0301";
  const std::string below = "\u0323";
  std::string grouped = "a";
  std::string alternating = "a";
  for (int i = 0; i < 16'000; ++i) alternating += above + below;
  for (int i = 0; i < 16'000; ++i) grouped += above;
  for (int i = 0; i < 16'000; ++i) grouped += below;
  check({
      {"a" + above + below, kAnyCase, "A" + below + above, true},
      {"a" + above + below, kExact, "a" + below + above, false},
      {grouped, kAnyCase, alternating, true},
      {"a", kAnyMark, alternating, true},
      {"a", kAnyCase, alternating, false},
  });
}

TEST(TextMatcher, OrdersByTheBytesOfTheFoldedForms) {
  const auto order = [](const std::string& pattern, TextFolding folding, const std::string& text) {
    return TextMatcher(patternFromSource(pattern, folding)).compare(text);
  };
  EXPECT_EQ(order("b", kExact, "a"), std::strong_ordering::less);
  EXPECT_EQ(order("b", kExact, "B"), std::strong_ordering::less);
  EXPECT_EQ(order("b", kAnyCase, "B"), std::strong_ordering::equal);
  EXPECT_EQ(order("b", kExact, "b1"), std::strong_ordering::greater);
  EXPECT_EQ(order("z", kExact, "\xff"), std::strong_ordering::greater);
}

}  // namespace
}  // namespace norvex
