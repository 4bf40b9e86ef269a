// Any bytes as a predicate: it is refused with a place in the text, or it means the same in memory and as
// SQL.
//
// The bytes up to the first NUL are the predicate. What follows becomes the name and a comment of one of the
// items, so that the other side of a comparison is as arbitrary.
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <string_view>
#include <variant>

#include "PredicateWorld.h"
#include "index/PredicateParser.h"

namespace norvex::test {
namespace {

constexpr std::int64_t kSecond = 1'000'000'000;
constexpr std::int64_t kArbitraryItem = 7;

PredicateWorld& world() {
  static PredicateWorld made;
  static const bool isFilled = [] {
    made.add({1, "public.jpeg", "Image", {"public.jpeg", "public.image", "public.data"}});
    made.add({2, "public.folder", std::nullopt, {"public.folder", "public.item"}});
    made.add({3, "x", "x", {}});
    made.put({1, "IMG_1.jpg", 100, 1 * kSecond, 1, {{"n", std::int64_t{7}}}});
    made.put({2, "\xc3\x89t\xc3\xa9", std::nullopt, 2 * kSecond + kSecond / 2, 2, {{"n", 7.5}}});
    made.put({3, "2024", 9'007'199'254'740'993, 0, 3, {{"n", "seven"}, {"kMDItemComment", "a*b"}}});
    made.put({4, "\xff*", 0, -kSecond, std::nullopt, {{"n", ""}}});
    made.put({5, "img_2.JPG", 101, 1'700'000'000 * kSecond + 5, 1, {{"n", "\xff"}}});
    made.put({6, "e\xcc\x81", 7, 7, 9, {{"n", 1e300}}});
    return true;
  }();
  static_cast<void>(isFilled);
  return made;
}

[[noreturn]] void fail(const std::string& what) {
  std::fprintf(stderr, "PredicateFuzz: %s\n", what.c_str());
  std::abort();
}

void checkError(const PredicateError& error, std::string_view text) {
  if (error.column == 0 || error.column > text.size() + 1) fail("a column outside of the text");
  if (error.expected.empty() || error.message.empty()) fail("an error without words");
}

void checkPredicate(const Predicate& predicate) {
  const auto bySql = world().matchesInSql(predicate);
  if (const auto* const refusal = std::get_if<std::string>(&bySql)) fail("SQLite refuses: " + *refusal);
  if (std::get<ItemIds>(bySql) != world().matchesInMemory(predicate)) fail("memory and SQL differ");
}

}  // namespace
}  // namespace norvex::test

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using namespace norvex;
  const std::string_view input(reinterpret_cast<const char*>(data), size);
  const std::size_t end = input.find('\0');
  const std::string_view text = input.substr(0, end);
  const auto parsed = parsePredicate(text);
  if (const auto* const error = std::get_if<PredicateError>(&parsed)) {
    test::checkError(*error, text);
    return 0;
  }
  const std::string arbitrary(end == std::string_view::npos ? std::string_view() : input.substr(end + 1));
  test::world().put(
      {test::kArbitraryItem, arbitrary, 7, 7, 3, {{"kMDItemComment", test::storedValue(arbitrary)}}});
  test::checkPredicate(std::get<Predicate>(parsed));
  return 0;
}
