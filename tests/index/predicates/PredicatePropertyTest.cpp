// Random predicates over random items: memory and SQL agree on every one.
#include <gtest/gtest.h>

#include <array>
#include <optional>
#include <random>
#include <string>
#include <string_view>
#include <variant>

#include "PredicateWorld.h"
#include "index/PredicateParser.h"
#include "platform/Utf8.h"

namespace norvex {
namespace {

using test::ItemIds;
using test::PredicateWorld;

// Few texts and numbers, close to each other, so that items and predicates meet often.
constexpr std::array<std::string_view, 30> kTexts{"",
                                                  "a",
                                                  "A",
                                                  "ab",
                                                  "aB",
                                                  "ba",
                                                  "b",
                                                  "été",
                                                  "e\u0301te\u0301",
                                                  "ETE",
                                                  "Straße",
                                                  "STRASSE",
                                                  "2024",
                                                  "02024",
                                                  "2024.0",
                                                  "10",
                                                  "9",
                                                  "-5",
                                                  "1e3",
                                                  "1e999",
                                                  "a*b",
                                                  "a\\b",
                                                  "it's",
                                                  "\"q\"",
                                                  "\xff",
                                                  "\xff"
                                                  "a",
                                                  "é\xff",
                                                  "日本",
                                                  "a b",
                                                  "image"};
constexpr std::array<std::string_view, 16> kNumbers{
    "0",    "1",   "-1",   "5",   "10",         "2024",         "2024.0",           "5.5",
    "-5.0", "1e3", "1000", "1.5", "1700000000", "1700000000.5", "9007199254740993", "9007199254740992.0"};
constexpr std::array<std::int64_t, 10> kWholes{
    0, 1, -1, 5, 10, 1000, 2024, 9007199254740993, 9007199254740992, 9};
constexpr std::array<std::string_view, 10> kAttributes{"kMDItemFSName",
                                                       "kMDItemPath",
                                                       "kMDItemFSSize",
                                                       "kMDItemFSContentChangeDate",
                                                       "kMDItemContentType",
                                                       "kMDItemKind",
                                                       "kMDItemContentTypeTree",
                                                       "rating",
                                                       "comment",
                                                       "unheard"};
constexpr std::int64_t kHalfSecondLater =
    1'700'000'000'500'000'000;  // than one of the numbers, in nanoseconds
constexpr std::array<std::string_view, 7> kOperators{"==", "=", "!=", "<", "<=", ">", ">="};

class Chance {
 public:
  explicit Chance(std::uint32_t seed) : engine_(seed) {}
  std::size_t below(std::size_t limit) { return engine_() % limit; }
  bool oneIn(std::size_t count) { return below(count) == 0; }
  template <typename List>
  auto of(const List& list) {
    return list[below(list.size())];
  }

 private:
  std::mt19937 engine_;
};

// A string literal that is, or is near, one of the texts.
std::string quoted(Chance& chance, bool mayHaveWildcard) {
  const std::string text(chance.of(kTexts));
  const char quote = chance.oneIn(2) ? '\'' : '"';
  std::string literal(1, quote);
  for (const char c : text) {
    if (mayHaveWildcard && chance.oneIn(8)) {
      literal += '*';
      continue;
    }
    if (c == quote || c == '\\' || c == '*' || chance.oneIn(20)) literal += '\\';
    literal += c;
  }
  if (mayHaveWildcard && chance.oneIn(4)) literal += '*';
  literal += quote;
  if (chance.oneIn(3)) literal += 'c';
  if (chance.oneIn(3)) literal += 'd';
  return literal;
}

// Mostly what the attribute holds; the other kind of value now and then.
std::string value(Chance& chance, std::string_view attribute, bool mayHaveWildcard) {
  const bool isNumber = attribute.starts_with("kMDItemFSS") || attribute.starts_with("kMDItemFSC");
  const bool wantsNumber = attribute == "rating" ? chance.oneIn(2) : isNumber != chance.oneIn(6);
  return wantsNumber ? std::string(chance.of(kNumbers)) : quoted(chance, mayHaveWildcard);
}

std::string randomTest(Chance& chance) {
  const std::string attribute(chance.of(kAttributes));
  if (chance.oneIn(6)) {
    const std::string low = value(chance, attribute, false);
    return "InRange(" + attribute + ", " + low + "," + value(chance, attribute, false) + ")";
  }
  const std::string comparison(chance.of(kOperators));
  const bool isEquality =
      comparison.find('<') == std::string::npos && comparison.find('>') == std::string::npos;
  if (isEquality && chance.oneIn(8)) return attribute + comparison + "*";
  return attribute + " " + comparison + " " + value(chance, attribute, isEquality);
}

// Every part is made in a statement of its own: the same seed yields the same predicates with any compiler.
std::string randomPredicate(Chance& chance, std::size_t depth) {
  if (depth == 0 || chance.oneIn(3)) return randomTest(chance);
  const auto form = chance.below(5);
  if (form == 0) return "NOT " + randomTest(chance);
  const std::string operand = randomPredicate(chance, depth - 1);
  if (form == 1) return "!(" + operand + ")";
  if (form == 2) return "(" + operand + ")";
  return operand + (form == 3 ? " && " : " || ") + randomPredicate(chance, depth - 1);
}

// The columns of types hold nothing but text.
std::string characters(Chance& chance) {
  std::string text;
  do text = chance.of(kTexts);
  while (!isValidUtf8(text));
  return text;
}

PredicateValue sparseValue(Chance& chance) {
  if (chance.oneIn(4)) return chance.of(kWholes);
  if (chance.oneIn(4)) return static_cast<double>(chance.of(kWholes)) + 0.5;
  return test::storedValue(std::string(chance.of(kTexts)));
}

void fill(PredicateWorld& world, Chance& chance) {
  for (std::int64_t id = 1; id <= 8; ++id) {
    test::WorldType type{id, characters(chance), std::nullopt, {}};
    if (!chance.oneIn(4)) type.kind = characters(chance);
    for (auto count = chance.below(4); count > 0; --count) type.tree.push_back(characters(chance));
    world.add(type);
  }
  for (std::int64_t id = 1; id <= 60; ++id) {
    test::WorldItem item{id, std::string(chance.of(kTexts)), std::nullopt, 0, std::nullopt, {}};
    if (!chance.oneIn(4)) item.size = chance.of(kWholes);
    item.mtime = chance.oneIn(2) ? kHalfSecondLater : chance.of(kWholes) * 900;
    if (!chance.oneIn(5)) item.type = static_cast<std::int64_t>(chance.below(9)) + 1;  // 9 is no type
    if (chance.oneIn(2)) item.sparse["rating"] = sparseValue(chance);
    if (chance.oneIn(2)) item.sparse["comment"] = sparseValue(chance);
    world.put(item);
  }
}

class PredicateProperty : public testing::TestWithParam<std::uint32_t> {};

TEST_P(PredicateProperty, MemoryAndSqlAgree) {
  Chance chance(GetParam());
  PredicateWorld world;
  fill(world, chance);
  std::size_t selective = 0;
  constexpr std::size_t count = 500;
  for (std::size_t i = 0; i < count; ++i) {
    const std::string text = randomPredicate(chance, 4);
    const auto parsed = parsePredicate(text);
    ASSERT_TRUE(std::holds_alternative<Predicate>(parsed)) << text << "\n"
                                                           << std::get<PredicateError>(parsed).message;
    const auto& predicate = std::get<Predicate>(parsed);
    const ItemIds inMemory = world.matchesInMemory(predicate);
    const auto bySql = world.matchesInSql(predicate);
    ASSERT_TRUE(std::holds_alternative<ItemIds>(bySql)) << text << "\n" << std::get<std::string>(bySql);
    ASSERT_EQ(std::get<ItemIds>(bySql), inMemory) << text;
    if (!inMemory.empty() && inMemory.size() < 60) ++selective;
  }
  // Predicates that match everything or nothing would show little.
  EXPECT_GT(selective, count / 3);
}

INSTANTIATE_TEST_SUITE_P(Seeds, PredicateProperty, testing::Range(std::uint32_t{1}, std::uint32_t{21}));

}  // namespace
}  // namespace norvex
