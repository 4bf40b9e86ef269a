#include "index/PredicateSql.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cctype>
#include <string>
#include <vector>

#include "PredicateWorld.h"
#include "index/PredicateFunctions.h"
#include "index/PredicateParser.h"

namespace norvex {
namespace {

using test::ItemIds;
using test::PredicateWorld;
using testing::HasSubstr;
using testing::Not;

Predicate parsed(const std::string& text) {
  auto result = parsePredicate(text);
  if (const auto* const error = std::get_if<PredicateError>(&result)) {
    ADD_FAILURE() << text.substr(0, 100) << ": " << error->message;
    return {};
  }
  return std::get<Predicate>(std::move(result));
}

std::string shown(const SqlValue& value) {
  if (const auto* const whole = std::get_if<std::int64_t>(&value)) return std::to_string(*whole);
  if (const auto* const real = std::get_if<double>(&value)) return std::to_string(*real);
  if (const auto* const text = std::get_if<SqlText>(&value)) return "text " + text->bytes;
  return "blob " + std::get<SqlBlob>(value).bytes;
}

struct Row {
  std::string predicate;
  std::string where;
  std::vector<std::string> values;
};

const std::string kSparse =
    "i.id IN (SELECT item FROM attributes WHERE name = (SELECT id FROM attribute_names WHERE name = ?) AND "
    "item >= ?1 AND "
    "item <= ?2 AND ";

TEST(PredicateSql, SimpleEqualityIsPlainEquality) {
  const std::vector<Row> rows{
      {"kMDItemFSSize == 5", "(i.size = ?)", {"5"}},
      {"kMDItemFSName == 'a'", "(i.name IN (?, ?))", {"text a", "blob a"}},
      {"kMDItemContentType == 'x'", "i.type IN (SELECT id FROM types WHERE (identifier = ?))", {"text x"}},
      {"kMDItemKind == 'x'", "i.type IN (SELECT id FROM types WHERE (kind = ?))", {"text x"}},
      {"kMDItemContentTypeTree == 'x'",
       "i.type IN (SELECT type FROM type_tree WHERE (ancestor = ?))",
       {"text x"}},
      {"other == 1", kSparse + "(value = ?))", {"text other", "1"}},
      {"other == 'x'", kSparse + "(value IN (?, ?)))", {"text other", "text x", "blob x"}},
      {"other == '1'", kSparse + "(value IN (?, ?, ?)))", {"text other", "text 1", "blob 1", "1"}},
      {"kMDItemFSName == 'a*'d", "(predicate_compare(i.name, '=', ?, 0, 1))", {"blob a*"}},
      {"kMDItemFSSize != *", "((i.size IS NOT NULL)) IS NOT TRUE", {}},
  };
  for (const auto& row : rows) {
    const auto sql = compilePredicate(parsed(row.predicate));
    std::vector<std::string> values;
    for (const auto& value : sql.values) values.push_back(shown(value));
    EXPECT_EQ(sql.where, row.where) << row.predicate;
    EXPECT_EQ(values, row.values) << row.predicate;
  }
}

TEST(PredicateSql, HoldsNothingOfTheUsersText) {
  const auto sql = compilePredicate(
      parsed("evil_name == 'evil_text' && InRange(evil2, 66601, 'evil3'c) || kMDItemFSName == '*evil4*' && "
             "kMDItemFSSize > 66602.5 && kMDItemKind != 'evil\\' OR 1=1 --'"));
  EXPECT_THAT(sql.where, Not(HasSubstr("evil")));
  EXPECT_THAT(sql.where, Not(HasSubstr("666")));
  EXPECT_THAT(sql.where, Not(HasSubstr("--")));
  std::size_t anonymous = 0;
  for (std::size_t at = sql.where.find('?'); at != std::string::npos; at = sql.where.find('?', at + 1)) {
    anonymous += std::isdigit(static_cast<unsigned char>(sql.where[at + 1])) == 0 ? 1 : 0;
  }
  EXPECT_EQ(anonymous, sql.values.size());
}

TEST(PredicateSql, FindsNamesStoredAsTextOrBlob) {
  PredicateWorld world;
  world.put({1, "a", 5, 0, std::nullopt, {}});
  world.put({2, "a", 5, 0, std::nullopt, {}});
  world.execute("UPDATE items SET name = CAST(name AS TEXT) WHERE id = 2");
  for (const std::string predicate :
       {"kMDItemFSName == 'a'", "kMDItemFSName == 'A'c", "kMDItemFSName < 'b'"}) {
    EXPECT_EQ(std::get<ItemIds>(world.matchesInSql(parsed(predicate))), (ItemIds{1, 2})) << predicate;
  }
}

// The deepest and the longest predicates that parse, each way to nest: SQLite must take them all.
TEST(PredicateSql, SqliteTakesWhateverParses) {
  const auto repeated = [](const std::string& text, std::size_t count) {
    std::string result;
    for (std::size_t i = 0; i < count; ++i) result += text;
    return result;
  };
  const std::size_t depth = kMaxPredicateDepth;
  const std::size_t count = kMaxPredicateComparisons;
  const std::string leaf = "InRange(x,'a'c,'b'd)";
  const std::vector<std::string> rows{
      repeated("!", depth) + leaf,
      repeated("(" + leaf + "||(" + leaf + "&&", depth / 2) + leaf + repeated("))", depth / 2),
      repeated("(" + leaf + "||!(" + leaf + "&&", depth / 3) + leaf + repeated("))", depth / 3),
      repeated("(", depth) + leaf + repeated("||" + leaf + ")", depth),
      repeated("!(" + leaf + "||", depth / 2) + leaf + repeated("||x!=1)", depth / 2),
      repeated("x='a'||", count - 1) + leaf,
      repeated("x!='a'&&", count - 1) + leaf,
      repeated("kMDItemKind='a'||", count - 1) + "kMDItemKind='a'",
      repeated("kMDItemContentType='a'c&&", count - 1) + "kMDItemFSSize>1",
      "!(" + repeated("x='a'||y<2&&", count / 2 - 1) + leaf + ")",
  };
  PredicateWorld world;
  world.put({1, "a", 5, 0, std::nullopt, {{"x", "a"}}});
  for (const auto& row : rows) {
    const auto predicate = parsed(row);
    const auto bySql = world.matchesInSql(predicate);
    ASSERT_TRUE(std::holds_alternative<ItemIds>(bySql))
        << std::get<std::string>(bySql) << " " << row.substr(0, 80);
    EXPECT_EQ(std::get<ItemIds>(bySql), world.matchesInMemory(predicate)) << row.substr(0, 80);
  }
}

TEST(PredicateSql, ReportsAValueThatCannotBeBound) {
  PredicateSql sql;
  sql.values.emplace_back(std::int64_t{1});
  EXPECT_FALSE(bindPredicateValues(nullptr, sql).ok());
}

}  // namespace
}  // namespace norvex
