// What predicates mean, held against the evaluator and against SQL: every row is asked of both.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "PredicateWorld.h"
#include "index/PredicateParser.h"

namespace norvex {
namespace {

using test::ItemIds;
using test::PredicateWorld;

struct Row {
  std::string predicate;
  ItemIds items;
};

constexpr std::int64_t kSecond = 1'000'000'000;

class PredicateMeaning : public testing::Test {
 protected:
  PredicateMeaning() {
    world_.add({10, "public.jpeg", "Image", {"public.jpeg", "public.image", "public.data"}});
    world_.add({11, "public.folder", std::nullopt, {"public.folder", "public.item"}});
    world_.add({12, "x-vdi", "Virtual Disk Image", {"x-vdi", "public.data"}});
    world_.put({1, "IMG_1.jpg", 100, 1 * kSecond, 10, {{"count", std::int64_t{7}}}});
    world_.put({2, "\xc3\x89t\xc3\xa9", std::nullopt, 2 * kSecond + kSecond / 2, 11, {{"count", 7.5}}});
    world_.put({3, "2024", 9'007'199'254'740'993, 0, 12, {{"count", "seven"}}});
    world_.put({4, "\xff*", 0, -kSecond, std::nullopt, {{"count", ""}}});
    world_.put({5, "img_2.JPG", 101, 1'700'000'000 * kSecond + 5, 10, {{"count", "\xff"}}});
  }

  void check(const std::vector<Row>& rows) {
    for (const auto& row : rows) {
      const auto parsed = parsePredicate(row.predicate);
      const auto* const predicate = std::get_if<Predicate>(&parsed);
      ASSERT_NE(predicate, nullptr) << std::get<PredicateError>(parsed).message;
      EXPECT_EQ(world_.matchesInMemory(*predicate), row.items) << "in memory: " << row.predicate;
      const auto bySql = world_.matchesInSql(*predicate);
      ASSERT_TRUE(std::holds_alternative<ItemIds>(bySql)) << std::get<std::string>(bySql) << row.predicate;
      EXPECT_EQ(std::get<ItemIds>(bySql), row.items) << "by SQL: " << row.predicate;
    }
  }

  PredicateWorld world_;
};

TEST_F(PredicateMeaning, ComparesNumbersByTheirValues) {
  check({
      {"kMDItemFSSize == 100", {1}},
      {"kMDItemFSSize == 100.0", {1}},
      {"kMDItemFSSize != 100", {2, 3, 4, 5}},
      {"kMDItemFSSize < 101", {1, 4}},
      {"kMDItemFSSize <= 101", {1, 4, 5}},
      {"kMDItemFSSize > 100", {3, 5}},
      {"kMDItemFSSize > 100.5", {3, 5}},
      {"kMDItemFSSize >= 101", {3, 5}},
      {"kMDItemFSSize == 9007199254740993", {3}},
      {"kMDItemFSSize > 9007199254740992.0", {3}},
      {"kMDItemFSSize == 9007199254740992", {}},
      {"InRange(kMDItemFSSize, 0, 100)", {1, 4}},
      {"InRange(kMDItemFSSize, 100, 101)", {1, 5}},
      {"InRange(kMDItemFSSize, 101, 100)", {}},
      {"kMDItemFSSize == 1e300", {}},
      {"kMDItemFSSize < 1e300", {1, 3, 4, 5}},
      {"kMDItemFSSize > 9223372036854775808", {}},
  });
}

TEST_F(PredicateMeaning, ComparesMomentsAsSecondsWithFractions) {
  check({
      {"kMDItemFSContentChangeDate == 2.5", {2}},
      {"kMDItemFSContentChangeDate == '2.5'", {2}},
      {"kMDItemFSContentChangeDate < 0", {4}},
      {"kMDItemFSContentChangeDate >= 1", {1, 2, 5}},
      {"kMDItemFSContentChangeDate > 1699999999", {5}},
      {"InRange(kMDItemFSContentChangeDate, 0, 2.5)", {1, 2, 3}},
      {"kMDItemFSContentChangeDate == *", {1, 2, 3, 4, 5}},
  });
}

TEST_F(PredicateMeaning, ComparesTextsByTheirBytes) {
  check({
      {"kMDItemFSName == 'IMG_1.jpg'", {1}},
      {"kMDItemFSName == 'img_1.jpg'", {}},
      {"kMDItemFSName != 'IMG_1.jpg'", {2, 3, 4, 5}},
      {"kMDItemFSName < 'IMG'", {3}},
      {"kMDItemFSName <= '2024'", {3}},
      {"kMDItemFSName > 'img'", {2, 4, 5}},
      {"kMDItemFSName >= '\xff'", {4}},
      {"InRange(kMDItemFSName, 'I', 'J')", {1}},
      {"InRange(kMDItemFSName, 'I'c, 'J'c)", {1, 5}},
      {"kMDItemFSName == '\xff\\*'", {4}},
      {"kMDItemPath == '/folder1/IMG_1.jpg'", {1}},
      {"kMDItemPath == '/folder1/*'", {1, 4}},
      {"kMDItemPath == *", {1, 2, 3, 4, 5}},
      {"kMDItemPath < '/folder1'", {3}},
  });
}

TEST_F(PredicateMeaning, MatchesWildcardsAndModifiers) {
  check({
      {"kMDItemFSName == '*.jpg'", {1}},
      {"kMDItemFSName == '*.jpg'c", {1, 5}},
      {"kMDItemFSName != '*.jpg'c", {2, 3, 4}},
      {"kMDItemFSName == 'ete'cd", {2}},
      {"kMDItemFSName == 'ete'd", {}},
      {"kMDItemFSName == 'Ete'd", {2}},
      {"kMDItemFSName == '*'", {1, 2, 3, 4, 5}},
      {"kMDItemFSName == '*\\*'", {4}},
      {"kMDItemContentTypeTree == 'public.*'", {1, 2, 3, 5}},
      {"kMDItemKind == 'virtual*'c", {3}},
      {"kMDItemKind == 'IMAGE'c", {1, 5}},
      {"kMDItemKind == 'IMAGE'", {}},
  });
}

TEST_F(PredicateMeaning, AMultiValuedAttributeMatchesWhenAnyValueDoes) {
  check({
      {"kMDItemContentTypeTree == 'public.image'", {1, 5}},
      {"kMDItemContentTypeTree == 'public.data'", {1, 3, 5}},
      {"kMDItemContentTypeTree == 'x-vdi'", {3}},
      {"kMDItemContentTypeTree > 'public.image'", {1, 2, 3, 5}},
      {"kMDItemContentTypeTree < 'public.e'", {1, 3, 5}},
      // One value must lie in the range: public.data and public.jpeg lie around it.
      {"InRange(kMDItemContentTypeTree, 'public.e', 'public.g')", {2}},
      {"kMDItemContentTypeTree >= 'public.e' && kMDItemContentTypeTree <= 'public.g'", {1, 2, 3, 5}},
  });
}

TEST_F(PredicateMeaning, NotEqualIsTheNegationOfEqual) {
  check({
      {"kMDItemContentTypeTree != 'public.image'", {2, 3, 4}},
      {"!(kMDItemContentTypeTree == 'public.image')", {2, 3, 4}},
      {"kMDItemKind != 'Image'", {2, 3, 4}},
      {"kMDItemKind != 'nothing'", {1, 2, 3, 4, 5}},
      {"count != 7", {2, 3, 4, 5}},
      {"unheard != 'x'", {1, 2, 3, 4, 5}},
      {"kMDItemFSSize != 'x'", {1, 2, 3, 4, 5}},
  });
}

TEST_F(PredicateMeaning, AnAttributeWithoutValueMatchesNothing) {
  check({
      {"kMDItemFSSize >= 0", {1, 3, 4, 5}},
      {"!(kMDItemFSSize >= 0)", {2}},
      {"kMDItemFSSize < 0", {}},
      {"!(kMDItemFSSize < 0)", {1, 2, 3, 4, 5}},
      {"!(kMDItemFSSize > 0 && kMDItemKind == 'Image')", {2, 3, 4}},
      {"!(kMDItemFSSize > 0 || kMDItemKind == 'Image')", {2, 4}},
      {"unheard == 'x'", {}},
      {"unheard < 5", {}},
      {"kMDItemKind == ''", {}},
      {"kMDItemContentType > ''", {1, 2, 3, 5}},
  });
}

TEST_F(PredicateMeaning, AStarAsksForPresence) {
  check({
      {"kMDItemFSSize == *", {1, 3, 4, 5}},
      {"kMDItemFSSize != *", {2}},
      {"kMDItemKind == *", {1, 3, 5}},
      {"kMDItemKind != *", {2, 4}},
      {"kMDItemContentType != *", {4}},
      {"kMDItemContentTypeTree == *", {1, 2, 3, 5}},
      {"count == *", {1, 2, 3, 4, 5}},  // an empty value is a value
      {"unheard == *", {}},
      {"unheard != *", {1, 2, 3, 4, 5}},
  });
}

TEST_F(PredicateMeaning, ANumberAndATextCompareWhenTheTextIsANumber) {
  check({
      {"kMDItemFSName == 2024", {3}},
      {"kMDItemFSName == 2024.0", {3}},
      {"kMDItemFSName > 2023", {3}},  // the other names are no numbers
      {"kMDItemFSName == '2024.0'", {}},
      {"kMDItemFSSize == '100'", {1}},
      {"kMDItemFSSize == '1e2'", {1}},
      {"kMDItemFSSize > '100'", {3, 5}},
      {"kMDItemFSSize == '1*'", {}},
      {"kMDItemFSSize == '*'", {}},
      {"kMDItemFSSize > 'a'", {}},
      {"InRange(kMDItemFSSize, '100', 101)", {1, 5}},
      {"kMDItemKind == 5", {}},
  });
}

TEST_F(PredicateMeaning, SparseAttributesKeepWhatTheyAre) {
  check({
      {"count == 7", {1}},
      {"count == '7'", {1}},
      {"count == '7.0'c", {1}},
      {"count == 7.5", {2}},
      {"count > 0", {1, 2}},
      {"count < 100", {1, 2}},
      {"InRange(count, 7, 8)", {1, 2}},
      {"count > '7'", {2, 3, 5}},  // texts by their bytes, numbers by the number that the text is
      {"count >= ''", {3, 4, 5}},
      {"count == 'seven'", {3}},
      {"count == 'SEVEN'c", {3}},
      {"count == 'se*'", {3}},
      {"count == '*'", {3, 4, 5}},
      {"count == ''", {4}},
      {"count == '\xff'", {5}},
      {"count == 'Seven'", {}},
  });
}

TEST_F(PredicateMeaning, JoinsTests) {
  check({
      {"kMDItemContentTypeTree == 'public.image' && kMDItemFSSize > 100", {5}},
      {"kMDItemContentTypeTree == 'public.image' || kMDItemFSSize == 0", {1, 4, 5}},
      {"!(kMDItemContentTypeTree == 'public.image') && kMDItemFSSize == *", {3, 4}},
      {"count == 7 || kMDItemFSName == 2024 && kMDItemFSSize < 5", {1}},
      {"(count == 7 || kMDItemFSName == 2024) && kMDItemFSSize < 5", {}},
      {"!!(count == 7)", {1}},
  });
}

}  // namespace
}  // namespace norvex
