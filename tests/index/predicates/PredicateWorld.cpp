#include "PredicateWorld.h"

#include <sqlite3.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>

#include "index/NumberText.h"
#include "index/PredicateFunctions.h"
#include "platform/Utf8.h"

namespace norvex::test {
namespace {

constexpr const char* kSchema = R"(
  CREATE TABLE items(id INTEGER PRIMARY KEY, parent INTEGER, name BLOB, type INTEGER, size INTEGER, mtime INTEGER);
  CREATE TABLE types(id INTEGER PRIMARY KEY, identifier TEXT, kind TEXT);
  CREATE TABLE type_tree(type INTEGER, ancestor TEXT);
  CREATE TABLE attribute_names(id INTEGER PRIMARY KEY, name TEXT UNIQUE);
  CREATE TABLE attributes(name INTEGER, item INTEGER, value, PRIMARY KEY(name, item)) WITHOUT ROWID;
  CREATE INDEX items_by_type ON items(type);
)";

std::string pathOf(std::int64_t id, std::string_view name) {
  return "/folder" + std::to_string(id % 3) + "/" + std::string(name);
}

[[noreturn]] void giveUp(const std::string& what) {
  std::fprintf(stderr, "PredicateWorld: %s\n", what.c_str());
  std::abort();
}

class Statement {
 public:
  Statement(sqlite3* database, const std::string& sql) : database_(database) {
    const auto length = static_cast<int>(sql.size());
    isReady_ = sqlite3_prepare_v2(database, sql.c_str(), length, &statement_, nullptr) == SQLITE_OK;
  }
  ~Statement() { sqlite3_finalize(statement_); }
  Statement(const Statement&) = delete;
  Statement& operator=(const Statement&) = delete;

  bool isReady() const { return isReady_; }
  sqlite3_stmt* get() { return statement_; }
  std::string message() const { return sqlite3_errmsg(database_); }

  // Appends values as parameters 1, 2, ... in the order of the calls.
  void bind(std::int64_t value) { sqlite3_bind_int64(statement_, ++bound_, value); }
  void bind(double value) { sqlite3_bind_double(statement_, ++bound_, value); }
  void bind(std::nullopt_t) { sqlite3_bind_null(statement_, ++bound_); }
  // Text that is no UTF-8 can only be stored as a blob.
  void bind(const std::string& text) {
    isValidUtf8(text)
        ? sqlite3_bind_text64(statement_, ++bound_, text.data(), text.size(), SQLITE_TRANSIENT, SQLITE_UTF8)
        : bindBlob(text);
  }
  int bindBlob(const std::string& bytes) {
    return sqlite3_bind_blob64(statement_, ++bound_, bytes.data(), bytes.size(), SQLITE_TRANSIENT);
  }
  template <typename Value>
  void bind(const std::optional<Value>& value) {
    value ? bind(*value) : bind(std::nullopt);
  }

  bool step() { return (last_ = sqlite3_step(statement_)) == SQLITE_ROW; }
  bool failed() const { return last_ != SQLITE_ROW && last_ != SQLITE_DONE; }
  void run() {
    step();
    if (failed()) giveUp(message());
  }

 private:
  sqlite3* database_;
  sqlite3_stmt* statement_ = nullptr;
  bool isReady_ = false;
  int bound_ = 0;
  int last_ = SQLITE_OK;
};

void answerPath(sqlite3_context* context, int, sqlite3_value** arguments) {
  const auto& items = *static_cast<const std::map<std::int64_t, WorldItem>*>(sqlite3_user_data(context));
  const std::int64_t id = sqlite3_value_int64(arguments[0]);
  const std::string path = pathOf(id, items.at(id).name);
  sqlite3_result_blob64(context, path.data(), path.size(), SQLITE_TRANSIENT);
}

}  // namespace

PredicateWorld::PredicateWorld() {
  if (sqlite3_open(":memory:", &database_) != SQLITE_OK) giveUp("no database");
  execute(kSchema);
  sqlite3_create_function(database_, "path_of", 1, SQLITE_UTF8, &items_, answerPath, nullptr, nullptr);
  if (const auto registered = registerPredicateFunctions(database_); !registered) {
    giveUp(registered.error().description);
  }
}

PredicateWorld::~PredicateWorld() {
  sqlite3_close(database_);
}

void PredicateWorld::execute(const std::string& sql) {
  if (sqlite3_exec(database_, sql.c_str(), nullptr, nullptr, nullptr) != SQLITE_OK) {
    giveUp(sqlite3_errmsg(database_));
  }
}

void PredicateWorld::add(const WorldType& type) {
  types_[type.id] = type;
  Statement insertion(database_, "INSERT INTO types VALUES(?, ?, ?)");
  insertion.bind(type.id);
  insertion.bind(type.identifier);
  insertion.bind(type.kind);
  insertion.run();
  for (const auto& ancestor : type.tree) {
    Statement branch(database_, "INSERT INTO type_tree VALUES(?, ?)");
    branch.bind(type.id);
    branch.bind(ancestor);
    branch.run();
  }
}

void PredicateWorld::put(const WorldItem& item) {
  items_[item.id] = item;
  Statement insertion(database_, "INSERT OR REPLACE INTO items VALUES(?, 0, ?, ?, ?, ?)");
  insertion.bind(item.id);
  insertion.bindBlob(item.name);
  insertion.bind(item.type);
  insertion.bind(item.size);
  insertion.bind(item.mtime);
  insertion.run();
  Statement deletion(database_, "DELETE FROM attributes WHERE item = ?");
  deletion.bind(item.id);
  deletion.run();
  for (const auto& [name, value] : item.sparse) {
    Statement naming(database_, "INSERT OR IGNORE INTO attribute_names(name) VALUES(?)");
    naming.bind(name);
    naming.run();
    Statement attribute(
        database_, "INSERT INTO attributes VALUES((SELECT id FROM attribute_names WHERE name = ?), ?, ?)");
    attribute.bind(name);
    attribute.bind(item.id);
    std::visit([&](const auto& plain) { attribute.bind(plain); }, value);
    attribute.run();
  }
}

ItemIds PredicateWorld::matchesInMemory(const Predicate& predicate) const {
  ItemIds ids;
  for (const auto& [id, item] : items_) {
    const auto reader = [this, &known = item](std::string_view attribute) {
      return valuesOf(known, attribute);
    };
    if (matchesPredicate(predicate, reader)) ids.push_back(id);
  }
  return ids;
}

std::variant<ItemIds, std::string> PredicateWorld::matchesInSql(const Predicate& predicate) const {
  const PredicateSql sql = compilePredicate(predicate);
  Statement query(database_, queryOf(sql));
  if (!query.isReady()) return query.message();
  if (const auto bound = bindPredicateValues(query.get(), sql); !bound) return bound.error().description;
  bindItemRange(query.get(), 0, INT64_MAX);
  ItemIds ids;
  while (query.step()) ids.push_back(sqlite3_column_int64(query.get(), 0));
  if (query.failed()) return query.message();
  std::ranges::sort(ids);
  return ids;
}

std::string PredicateWorld::planOf(const Predicate& predicate) const {
  const PredicateSql sql = compilePredicate(predicate);
  Statement query(database_, "EXPLAIN QUERY PLAN " + queryOf(sql));
  if (!query.isReady()) return query.message();
  if (const auto bound = bindPredicateValues(query.get(), sql); !bound) return bound.error().description;
  std::string plan;
  while (query.step()) {
    plan += reinterpret_cast<const char*>(sqlite3_column_text(query.get(), 3));
    plan += '\n';
  }
  return plan;
}

std::vector<PredicateValue> PredicateWorld::valuesOf(const WorldItem& item,
                                                     std::string_view attribute) const {
  const auto ofType = [&](auto values) -> std::vector<PredicateValue> {
    const auto type = item.type ? types_.find(*item.type) : types_.end();
    if (type == types_.end()) return {};
    return values(type->second);
  };
  if (attribute == "kMDItemFSName") return {item.name};
  if (attribute == "kMDItemPath") return {pathOf(item.id, item.name)};
  if (attribute == "kMDItemFSContentChangeDate") return {static_cast<double>(item.mtime) / 1e9};
  if (attribute == "kMDItemFSSize") {
    return item.size ? std::vector<PredicateValue>{*item.size} : std::vector<PredicateValue>{};
  }
  if (attribute == "kMDItemContentType") {
    return ofType([](const WorldType& type) { return std::vector<PredicateValue>{type.identifier}; });
  }
  if (attribute == "kMDItemKind") {
    return ofType([](const WorldType& type) {
      return type.kind ? std::vector<PredicateValue>{*type.kind} : std::vector<PredicateValue>{};
    });
  }
  if (attribute == "kMDItemContentTypeTree") {
    return ofType([](const WorldType& type) {
      return std::vector<PredicateValue>(type.tree.begin(), type.tree.end());
    });
  }
  const auto found = item.sparse.find(std::string(attribute));
  return found == item.sparse.end() ? std::vector<PredicateValue>{} : std::vector{found->second};
}

PredicateValue storedValue(const std::string& text) {
  const auto number = numberFromText(text);
  if (!number) return text;
  return std::visit([](auto plain) { return PredicateValue(plain); }, *number);
}

}  // namespace norvex::test
