#include "tool/PredicateErrorText.h"

#include <gtest/gtest.h>

namespace norvex {
namespace {

struct Case {
  const char* name;
  std::string predicate;
  std::size_t column, width;
  std::string excerpt;
};

TEST(PredicateErrorExcerpt, PutsTheCaretBelowTheColumn) {
  const Case cases[] = {
      {"first column", "&& a", 1, 80, "  && a\n  ^\n"},
      {"behind the end", "a ==", 5, 80, "  a ==\n      ^\n"},
      {"far beyond the end", "a", 99, 80, "  a\n   ^\n"},
      {"characters of two bytes", "\u00e9\u00e9 ?", 4, 80, "  \u00e9\u00e9 ?\n     ^\n"},
      {"an escape takes its columns", "\x1b[ ?", 4, 80, "  \\x1B[ ?\n        ^\n"},
      {"a backslash stays one", "'\\*' ?", 6, 80, "  '\\*' ?\n       ^\n"},
      {"bytes that are no UTF-8", "\xff ?", 3, 80, "  \\xFF ?\n       ^\n"},
      {"the part that fits", "abcdefghijklmnopqrstuvwxyz", 20, 15, "  lmnopqrstuvw\n          ^\n"},
  };
  for (const Case& each : cases) {
    SCOPED_TRACE(each.name);
    EXPECT_EQ(predicateErrorExcerpt(each.predicate, {each.column, "", ""}, each.width), each.excerpt);
  }
}

}  // namespace
}  // namespace norvex
