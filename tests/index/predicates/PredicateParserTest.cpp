#include "index/PredicateParser.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "PredicateText.h"

namespace norvex {
namespace {

using test::textOf;

std::string understood(const std::string& text) {
  const auto parsed = parsePredicate(text);
  if (const auto* const error = std::get_if<PredicateError>(&parsed)) return error->message;
  return textOf(std::get<Predicate>(parsed));
}

PredicateError errorOf(const std::string& text) {
  const auto parsed = parsePredicate(text);
  const auto* const error = std::get_if<PredicateError>(&parsed);
  return error == nullptr ? PredicateError{0, "", "parsed: " + text} : *error;
}

struct Row {
  std::string text;
  std::string meaning;
};

void check(const std::vector<Row>& rows) {
  for (const auto& row : rows) EXPECT_EQ(understood(row.text), row.meaning) << row.text;
}

std::string repeated(const std::string& text, std::size_t count) {
  std::string result;
  for (std::size_t i = 0; i < count; ++i) result += text;
  return result;
}

TEST(PredicateParser, ReadsTheQueriesOfTheScan) {
  check({
      {"com_brixo_backup_excludeItem == 'com.brixo.backupd'",
       "(com_brixo_backup_excludeItem == 'com.brixo.backupd')"},
      {"kMDItemDovecartHasReceipt=1", "(kMDItemDovecartHasReceipt == 1)"},
      {"kMDItemContentTypeTree == 'public.movie' || kMDItemContentTypeTree == 'public.video'",
       "((kMDItemContentTypeTree == 'public.movie') || (kMDItemContentTypeTree == 'public.video'))"},
      {"kMDItemContentType == 'com.vmware.vm-package' || kMDItemContentType == 'com.parallels.vm.vmpackage' "
       "|| "
       "kMDItemKind == 'Virtual Disk Image'",
       "((kMDItemContentType == 'com.vmware.vm-package') || (kMDItemContentType == "
       "'com.parallels.vm.vmpackage') || (kMDItemKind == 'Virtual Disk Image'))"},
  });
}

TEST(PredicateParser, ReadsEveryOperator) {
  check({
      {"a == 1", "(a == 1)"},
      {"a = 1", "(a == 1)"},
      {"a != 1", "!(a == 1)"},
      {"a < 1", "(a < 1)"},
      {"a <= 1", "(a <= 1)"},
      {"a > 1", "(a > 1)"},
      {"a >= 1", "(a >= 1)"},
      {"a == *", "(a == *)"},
      {"a != *", "!(a == *)"},
      {"InRange(a, 1, 2.5)", "(a >= 1 <= 2.5r)"},
      {"inrange ( a , 'x' , \"y\"c )", "(a >= 'x' <= 'y'c)"},
      {"InRange == 1", "(InRange == 1)"},  // an attribute where no parenthesis follows
  });
}

TEST(PredicateParser, ReadsEveryLiteral) {
  check({
      {"a == 'it'", "(a == 'it')"},
      {"a == \"it's\"", "(a == 'it's')"},
      {R"(a == 'it\'s')", "(a == 'it's')"},
      {R"(a == "say \"it\"")", "(a == 'say \"it\"')"},
      {R"(a == 'back\\slash')", R"((a == 'back\\slash'))"},
      {"a == ''", "(a == '')"},
      {"a == '*.jpg'", "(a == '*.jpg')"},
      {R"(a == 'a\*b')", R"((a == 'a\*b'))"},
      {"a == 'x'c", "(a == 'x'c)"},
      {"a == 'x'd", "(a == 'x'd)"},
      {"a == 'x'cd", "(a == 'x'cd)"},
      {"a == 'x'dc", "(a == 'x'cd)"},
      {"a == 'x'cc", "(a == 'x'c)"},
      {"a == '\xff\xfe'", "(a == '\xff\xfe')"},
      {"a == 'été'", "(a == 'été')"},
      {"a == -5", "(a == -5)"},
      {"a == +5", "(a == 5)"},
      {"a == 1.5", "(a == 1.5r)"},
      {"a == 2e3", "(a == 2000r)"},
      {"a == 2e+3", "(a == 2000r)"},
      {"a == 9223372036854775807", "(a == 9223372036854775807)"},
      {"a == 9223372036854775808", "(a == 9.22337e+18r)"},
  });
}

TEST(PredicateParser, ReadsAttributesOfAnyVendor) {
  check({
      {"_x9 == 1", "(_x9 == 1)"},
      {"com.vendor:key-2 == 1", "(com.vendor:key-2 == 1)"},
      {"größe == 1", "(größe == 1)"},
      {"order == 1", "(order == 1)"},  // begins like OR
      {"c == 1", "(c == 1)"},
  });
}

TEST(PredicateParser, NotBindsBeforeAndBeforeOr) {
  check({
      {"a=1 || b=1 && c=1", "((a == 1) || ((b == 1) && (c == 1)))"},
      {"a=1 && b=1 || c=1", "(((a == 1) && (b == 1)) || (c == 1))"},
      {"(a=1 || b=1) && c=1", "(((a == 1) || (b == 1)) && (c == 1))"},
      {"!a=1 && b=1", "(!(a == 1) && (b == 1))"},
      {"!(a=1 && b=1)", "!((a == 1) && (b == 1))"},
      {"!!a=1", "!!(a == 1)"},
      {"! a != 1", "!!(a == 1)"},
      {"!a=1 || !b=1 && !c=1", "(!(a == 1) || (!(b == 1) && !(c == 1)))"},
      {"a=1 && b=1 && c=1", "((a == 1) && (b == 1) && (c == 1))"},
      {"((a=1))", "(a == 1)"},
  });
}

TEST(PredicateParser, WordsJoinInAnyCase) {
  check({
      {"a=1 AND b=1 or NOT c=1", "(((a == 1) && (b == 1)) || !(c == 1))"},
      {"a=1 And b=1 OR not c=1", "(((a == 1) && (b == 1)) || !(c == 1))"},
      {"(a=1)AND(b=1)", "((a == 1) && (b == 1))"},
  });
}

TEST(PredicateParser, BlanksMeanNothing) {
  check({
      {"a=1&&b='x'c||!c=*", "(((a == 1) && (b == 'x'c)) || !(c == *))"},
      {" \t\r\n\v\fa\n=\t1 ", "(a == 1)"},
  });
}

struct ErrorRow {
  std::string text;
  std::size_t column;
  std::string expected;
};

constexpr auto kTest = "a comparison (attribute, operator, value), InRange, ! or (";
constexpr auto kOperator = "an operator (== != < <= > >=)";
constexpr auto kAnyValue = "a value (a string in quotes, a number or *)";
constexpr auto kValue = "a value (a string in quotes or a number)";
constexpr auto kNumber = "a number such as 5, -1.5 or 2e9, in the range of a double";
constexpr auto kEnd = "&&, || or the end";

TEST(PredicateParser, SaysWhereAndWhatWasExpected) {
  const std::vector<ErrorRow> rows{
      {"", 1, kTest},
      {"   ", 4, kTest},
      {"kMDItemKind = ", 15, kAnyValue},
      {"kMDItemKind", 12, kOperator},
      {"kMDItemKind 'x'", 13, kOperator},
      {"kMDItemKind ! 'x'", 13, kOperator},
      {"a == b", 6, kAnyValue},
      {"a === 1", 5, kAnyValue},
      {"a <> 1", 4, kValue},
      {"a < *", 5, kValue},
      {"a < ", 5, kValue},
      {"a < 'x*'", 5, "a string without wildcards (\\* stands for a star)"},
      {"'x' == a", 1, kTest},
      {"5 == a", 1, kTest},
      {"* == a", 1, kTest},
      {"a == 'x", 8, "a closing quote (')"},
      {"a == \"x'", 9, "a closing quote (\")"},
      {"a == 'x\\'", 10, "a closing quote (')"},
      {"a == 'x\\", 9, "a closing quote (')"},
      {"a == 'x'w", 9, "the modifiers c (any case), d (any diacritics) or none"},
      {"a == 'x'and b == 1", 9, "the modifiers c (any case), d (any diacritics) or none"},
      {"a == 5x", 6, kNumber},
      {"a == 1.", 6, kNumber},
      {"a == -", 6, kNumber},
      {"a == 1e999", 6, kNumber},
      {"a == 0x10", 6, kNumber},
      {"a == 1 b == 2", 8, kEnd},
      {"a == 1)", 7, kEnd},
      {"a == 1 & b == 2", 8, kEnd},
      {"a == 1 &&", 10, kTest},
      {"a == 1 && && b == 1", 11, kTest},
      {"|| a == 1", 1, kTest},
      {"(a == 1", 8, "&&, || or )"},
      {"(a == 1 # b", 9, "&&, || or )"},
      {"()", 2, kTest},
      {"!", 2, kTest},
      {"not", 4, kTest},
      {"a == 1 and", 11, kTest},
      {"InRange(", 9, "an attribute"},
      {"InRange(5, 1, 2)", 9, "an attribute"},
      {"InRange(a 1, 2)", 11, "a comma"},
      {"InRange(a, 1)", 13, "a comma"},
      {"InRange(a, 1, 2", 16, ")"},
      {"InRange(a, *, 2)", 12, kValue},
      {"InRange(a, 'x*', 'z')", 12, "a string without wildcards (\\* stands for a star)"},
      {"InRange(a, 1, 'x", 17, "a closing quote (')"},
      {"a.b(c, 1, 2)", 4, kOperator},
      {"été == ", 8, kAnyValue},            // characters
      {"a == 'été' b", 12, kEnd},           //
      {"a == '\xff\xc3\xa9' b", 12, kEnd},  // no UTF-8: bytes
      {std::string("a == 1 \0", 8), 8, kEnd},
  };
  for (const auto& row : rows) {
    const auto error = errorOf(row.text);
    EXPECT_EQ(error.column, row.column) << row.text;
    EXPECT_EQ(error.expected, row.expected) << row.text;
  }
}

TEST(PredicateParser, WritesTheErrorAsALineForPeople) {
  const std::vector<Row> rows{
      {"kMDItemKind = ",
       "column 15: expected a value (a string in quotes, a number or *), but the predicate ends there"},
      {"a == 1 b == 2", "column 8: expected &&, || or the end, but found: b"},
      {"a == x\xc2\x9b", "column 6: expected a value (a string in quotes, a number or *), but found: x??"},
      {"a == 1 \x1b[31m", "column 8: expected &&, || or the end, but found: ?"},
      {"a == 'x'w\xff",
       "column 9: expected the modifiers c (any case), d (any diacritics) or none, but found: w?"},
      {"a == ééééééééééééééé",
       "column 6: expected a value (a string in quotes, a number or *), but found: "
       "éééééééééééé..."},
      {"a == xéééééééééééééé",
       "column 6: expected a value (a string in quotes, a number or *), but found: "
       "xééééééééééé..."},
  };
  for (const auto& row : rows) EXPECT_EQ(errorOf(row.text).message, row.meaning) << row.text;
}

TEST(PredicateParser, TakesPredicatesUpToItsBoundsAndNoFurther) {
  const auto nested = [](std::size_t depth, const std::string& opening, const std::string& closing) {
    return repeated(opening, depth) + "a=1" + repeated(closing, depth);
  };
  const auto chained = [](std::size_t count) { return repeated("a=1||", count - 1) + "a=1"; };
  const auto ofLength = [](std::size_t length) { return "a='" + std::string(length - 4, 'x') + "'"; };

  EXPECT_EQ(errorOf(nested(kMaxPredicateDepth, "(", ")")).column, 0U);
  EXPECT_EQ(errorOf(nested(kMaxPredicateDepth + 1, "(", ")")).column, kMaxPredicateDepth + 1);
  EXPECT_EQ(errorOf(nested(kMaxPredicateDepth, "!", "")).column, 0U);
  EXPECT_EQ(errorOf(nested(kMaxPredicateDepth + 1, "!", "")).expected, "no more than 32 levels of ! and (");
  EXPECT_EQ(errorOf(chained(kMaxPredicateComparisons)).column, 0U);
  EXPECT_EQ(errorOf(chained(kMaxPredicateComparisons + 1)).column, kMaxPredicateComparisons * 5 + 1);
  EXPECT_EQ(errorOf(ofLength(kMaxPredicateLength)).column, 0U);
  EXPECT_EQ(errorOf(ofLength(kMaxPredicateLength + 1)).column, kMaxPredicateLength + 1);
}

TEST(PredicateParser, SurvivesHostileText) {
  for (const std::string unit :
       {"(", "!", "((!", "a=", "a=1||", "'", "\\", "'\\", "InRange(", "not ", "\xff", "*", "-"}) {
    EXPECT_GT(errorOf(repeated(unit, 3000)).column, 0U) << unit;
    EXPECT_GT(errorOf(repeated(unit, 300'000)).column, 0U) << unit;
  }
}

TEST(PredicateParser, GroupsBesideEachOtherAreNotDeep) {
  EXPECT_EQ(errorOf(repeated("(a=1)&&", kMaxPredicateDepth * 3) + "(a=1)").column, 0U);
}

}  // namespace
}  // namespace norvex
