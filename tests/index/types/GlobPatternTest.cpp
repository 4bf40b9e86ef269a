#include "index/GlobPattern.h"

#include <gtest/gtest.h>

#include <string>

namespace norvex {
namespace {

struct MatchCase {
  std::string_view pattern;
  std::string_view name;
  bool matches;
};

TEST(GlobPattern, MatchesTheWholeNameByShellRules) {
  constexpr MatchCase cases[] = {
      {"a", "a", true},
      {"a", "ab", false},
      {"a", "", false},
      {"", "", true},
      {"*", "", true},
      {"*", ".hidden", true},
      {"*.c", ".c", true},
      {"*.c", "a.c.c", true},
      {"*.c", "a.c.d", false},
      {"**", "x", true},
      {"a*b*c", "axbxbxc", true},
      {"a*b*c", "axcxb", false},
      {"?", "", false},
      {"?", "\xC3\xA9", true},
      {"?", "\xE2\x82\xAC", true},
      {"??", "\xC3\xA9", false},
      {"?x", "\xFFx", true},
      {"[abc]", "b", true},
      {"[abc]", "d", false},
      {"[a-c]", "b", true},
      {"[a-c]", "-", false},
      {"[a-]", "-", true},
      {"[]a]", "]", true},
      {"[!a]", "b", true},
      {"[!a]", "a", false},
      {"[^a]", "a", false},
      {"[!]a]", "]", false},
      {"[c-a]", "b", false},
      {"[0-9][0-9][0-9].vdr", "001.vdr", true},
      {"[0-9][0-9][0-9].vdr", "01.vdr", false},
      {"*.so.[0-9]*", "libc.so.6", true},
      {"*.so.[0-9]*", "libc.so.x.so.6.1", true},
      {"*.so.[0-9]*", "libc.so.", false},
      {"[a", "[a", true},
      {"[a", "a", false},
      {"\\*", "*", true},
      {"\\*", "a", false},
      {"a\\", "a\\", true},
      {"\\a", "a", true},
  };
  for (const MatchCase& each : cases) {
    EXPECT_EQ(globMatches(each.pattern, each.name), each.matches) << each.pattern << " on " << each.name;
  }
}

TEST(GlobPattern, IsNotHeldUpByManyStars) {
  // A matcher that tries every run for every star would not come back from this.
  std::string pattern;
  for (int star = 0; star < 100; ++star) pattern += "*a";
  pattern += "*b";
  EXPECT_FALSE(globMatches(pattern, std::string(255, 'a')));
}

struct ElementCase {
  std::string_view pattern;
  std::size_t length;
};

TEST(GlobPattern, KnowsWhereItsFirstElementEnds) {
  constexpr ElementCase cases[] = {{"", 0},      {"ab", 1},   {"*a", 1},    {"?", 1},
                                   {"[ab]c", 4}, {"[]]c", 3}, {"[!]]x", 4}, {"[abc", 1},
                                   {"\\*a", 2},  {"\\", 1},   {"[]", 1}};
  for (const ElementCase& each : cases)
    EXPECT_EQ(globElementLength(each.pattern), each.length) << each.pattern;
}

}  // namespace
}  // namespace norvex
