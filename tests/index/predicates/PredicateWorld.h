// The same items twice: in memory, and in an SQLite database laid out like a volume's store.
#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <variant>
#include <vector>

#include "index/Predicate.h"
#include "index/PredicateEvaluator.h"
#include "index/PredicateSql.h"

struct sqlite3;

namespace norvex::test {

struct WorldType {
  std::int64_t id = 0;
  std::string identifier;
  std::optional<std::string> kind;
  std::vector<std::string> tree;  // itself and what it conforms to
};

struct WorldItem {
  std::int64_t id = 0;
  std::string name;
  std::optional<std::int64_t> size;
  std::int64_t mtime = 0;            // nanoseconds since 1970
  std::optional<std::int64_t> type;  // a WorldType's id
  std::map<std::string, PredicateValue> sparse;
};

using ItemIds = std::vector<std::int64_t>;

class PredicateWorld {
 public:
  PredicateWorld();
  ~PredicateWorld();
  PredicateWorld(const PredicateWorld&) = delete;
  PredicateWorld& operator=(const PredicateWorld&) = delete;

  void add(const WorldType& type);
  // Replaces an item of the same id.
  void put(const WorldItem& item);
  void execute(const std::string& sql);

  // The ids of the items that match, ascending.
  ItemIds matchesInMemory(const Predicate& predicate) const;
  // The same by SQL; SQLite's message when it refuses the statement.
  std::variant<ItemIds, std::string> matchesInSql(const Predicate& predicate) const;

  // How SQLite is going to run the predicate's query: one step a line.
  std::string planOf(const Predicate& predicate) const;

 private:
  std::vector<PredicateValue> valuesOf(const WorldItem& item, std::string_view attribute) const;

  sqlite3* database_ = nullptr;
  std::map<std::int64_t, WorldType> types_;
  std::map<std::int64_t, WorldItem> items_;
};

// What a store keeps of an attribute that has this text: the number that it spells, else the text.
PredicateValue storedValue(const std::string& text);

}  // namespace norvex::test
