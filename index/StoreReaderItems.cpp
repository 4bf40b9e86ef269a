// The items of a store: by path, by number, their paths and attributes.
#include <algorithm>
#include <iterator>
#include <utility>

#include "index/PredicateFunctions.h"
#include "index/StoreReader.h"
#include "platform/Utf8.h"

namespace norvex {
namespace {

constexpr std::size_t kLongestPath = std::size_t{4} << 20U;
constexpr double kNanosecondsPerSecond = 1e9;

bool isName(std::string_view name) {
  return !name.empty() && name != "." && name != ".." && name.find('/') == std::string_view::npos &&
         name.find('\0') == std::string_view::npos;
}

// Resets the statement, and with that lets go of what it points into, at the end of a scope.
class Running {
 public:
  explicit Running(const StoreStatement& statement) : statement_(statement.get()) {}
  ~Running() {
    sqlite3_reset(statement_);
    sqlite3_clear_bindings(statement_);
  }
  Running(const Running&) = delete;
  Running& operator=(const Running&) = delete;

 private:
  sqlite3_stmt* statement_;
};

void bindBytes(sqlite3_stmt* statement, int index, std::string_view bytes) {
  sqlite3_bind_blob(statement, index, bytes.data(), static_cast<int>(bytes.size()), SQLITE_STATIC);
}

std::string lastComponent(const std::string& path) {
  return path.size() == 1 ? path : path.substr(path.rfind('/') + 1);
}

void appendName(std::string& path, std::string_view name) {
  if (!path.ends_with('/')) path += '/';
  path += name;
}

std::optional<MetadataValue> valueOf(sqlite3_stmt* row, int column) {
  switch (sqlite3_column_type(row, column)) {
    case SQLITE_INTEGER:
      return std::int64_t{sqlite3_column_int64(row, column)};
    case SQLITE_FLOAT:
      return sqlite3_column_double(row, column);
    case SQLITE_NULL:
      return std::nullopt;
    default:
      return std::string(storeBytes(row, column));
  }
}

void pathOfItem(sqlite3_context* context, int, sqlite3_value** arguments) {
  auto* reader = static_cast<StoreReader*>(sqlite3_user_data(context));
  const Result<std::string> path = reader->pathOf(sqlite3_value_int64(arguments[0]));
  if (!path) {
    sqlite3_result_error(context, path.error().description.c_str(), -1);
    sqlite3_result_error_code(context, SQLITE_CORRUPT);
    return;
  }
  const int length = static_cast<int>(path.value().size());
  if (isValidUtf8(path.value())) {
    sqlite3_result_text(context, path.value().data(), length, SQLITE_TRANSIENT);
  } else {
    sqlite3_result_blob(context, path.value().data(), length, SQLITE_TRANSIENT);
  }
}

}  // namespace

Result<void> StoreReader::registerFunctions() {
  if (sqlite3_create_function_v2(database_.handle(), "path_of", 1, SQLITE_UTF8 | SQLITE_DIRECTONLY, this,
                                 pathOfItem, nullptr, nullptr, nullptr) != SQLITE_OK) {
    return lastError();
  }
  return registerPredicateFunctions(database_.handle());
}

Result<StoredItem> StoreReader::item(std::int64_t id) {
  const Running running(itemById_);
  sqlite3_stmt* row = itemById_.get();
  sqlite3_bind_int64(row, 1, id);
  const int status = sqlite3_step(row);
  if (status == SQLITE_DONE) return damagedStore("an item is missing");
  if (status != SQLITE_ROW) return lastError();
  StoredItem item{id,
                  sqlite3_column_int64(row, 0),
                  std::string(storeBytes(row, 1)),
                  sqlite3_column_int64(row, 2),
                  std::nullopt,
                  sqlite3_column_int64(row, 4)};
  if (sqlite3_column_type(row, 3) != SQLITE_NULL) item.size = sqlite3_column_int64(row, 3);
  // A parent is crawled before its items. So the way up from any item ends at the root, whatever the rows
  // say.
  const bool isPlaced = id == kRootItem ? item.parent == 0 && item.name.empty()
                                        : item.parent >= kRootItem && item.parent < id && isName(item.name);
  if (!isPlaced) return damagedStore("an item is in no folder");
  if (item.size && *item.size < 0) return damagedStore("an item has a negative size");
  return item;
}

Result<std::string> StoreReader::pathOf(std::int64_t id) {
  if (id == kRootItem) return root_;
  auto found = item(id);
  if (!found) return found.error();
  if (found.value().parent != lastFolder_) {
    auto path = climb(found.value().parent);
    if (!path) return path.error();
    lastFolderPath_ = std::move(path).value();
    lastFolder_ = found.value().parent;
  }
  std::string path = lastFolderPath_;
  appendName(path, found.value().name);
  return path;
}

// The path of a folder, from the root or from the folder whose path is known.
Result<std::string> StoreReader::climb(std::int64_t folder) {
  std::vector<std::string> names;
  std::size_t length = 0;
  while (folder != kRootItem && folder != lastFolder_) {
    auto found = item(folder);
    if (!found) return found.error();
    length += found.value().name.size() + 1;
    if (length > kLongestPath) return damagedStore("an item is too deep");
    names.push_back(std::move(found.value().name));
    folder = found.value().parent;
  }
  std::string path = folder == kRootItem ? root_ : lastFolderPath_;
  if (path.size() + length > kLongestPath) return damagedStore("an item is too deep");
  std::reverse(names.begin(), names.end());
  for (const std::string& name : names) appendName(path, name);
  return path;
}

Result<std::optional<std::int64_t>> StoreReader::itemAt(std::string_view path) {
  std::optional<std::int64_t> at = kRootItem;
  while (at && !path.empty()) {
    const std::size_t end = std::min(path.find('/'), path.size());
    const std::string_view name = path.substr(0, end);
    path.remove_prefix(std::min(end + 1, path.size()));
    if (name.empty() || name == ".") continue;
    auto child = childNamed(*at, name);
    if (!child) return child.error();
    at = child.value();
  }
  return at;
}

Result<std::optional<std::int64_t>> StoreReader::childNamed(std::int64_t folder, std::string_view name) {
  allowWork(kAllWork);
  std::int64_t first = 0, count = 0, state = 0;
  {
    const Running running(folderById_);
    sqlite3_stmt* row = folderById_.get();
    sqlite3_bind_int64(row, 1, folder);
    const int status = sqlite3_step(row);
    if (status == SQLITE_DONE) return std::optional<std::int64_t>();  // no folder, or none that was crawled
    if (status != SQLITE_ROW) return lastError();
    first = sqlite3_column_int64(row, 0);
    count = sqlite3_column_int64(row, 1);
    state = sqlite3_column_int64(row, 2);
  }
  if (count == 0) return std::optional<std::int64_t>();
  const bool isPlaced = first > folder && count > 0 && count <= INT64_MAX - first;
  if (!isPlaced) return damagedStore("the items of a folder are not where they should be");
  return state == static_cast<std::int64_t>(StoreFolderState::sorted)
             ? searchSorted(folder, first, count, name)
             : searchUnsorted(folder, first, count, name);
}

Result<std::optional<std::int64_t>> StoreReader::searchSorted(std::int64_t folder, std::int64_t first,
                                                              std::int64_t count, std::string_view name) {
  std::int64_t low = first, high = first + count;
  while (low < high) {
    const std::int64_t middle = low + (high - low) / 2;
    auto found = item(middle);
    if (!found) return found.error();
    if (found.value().parent != folder)
      return damagedStore("the items of a folder are not where they should be");
    const int order = std::string_view(found.value().name).compare(name);
    if (order == 0) return std::optional(middle);
    if (order < 0) {
      low = middle + 1;
    } else {
      high = middle;
    }
  }
  return std::optional<std::int64_t>();
}

Result<std::optional<std::int64_t>> StoreReader::searchUnsorted(std::int64_t folder, std::int64_t first,
                                                                std::int64_t count, std::string_view name) {
  const Running running(childByName_);
  sqlite3_stmt* row = childByName_.get();
  sqlite3_bind_int64(row, 1, first);
  sqlite3_bind_int64(row, 2, first + count);
  sqlite3_bind_int64(row, 3, folder);
  bindBytes(row, 4, name);
  const int status = sqlite3_step(row);
  if (status == SQLITE_DONE) return std::optional<std::int64_t>();
  if (status != SQLITE_ROW) return lastError();
  return std::optional<std::int64_t>(sqlite3_column_int64(row, 0));
}

Result<const StoredType*> StoreReader::typeOf(std::int64_t type) {
  if (const auto known = types_.find(type); known != types_.end()) return &known->second;
  auto describe = prepare("SELECT identifier, kind FROM types WHERE id=?");
  auto listTree = prepare("SELECT ancestor FROM type_tree WHERE type=?");
  if (!describe) return describe.error();
  if (!listTree) return listTree.error();
  sqlite3_bind_int64(describe.value().get(), 1, type);
  if (sqlite3_step(describe.value().get()) != SQLITE_ROW)
    return damagedStore("an item has a type that is not there");
  StoredType found{std::string(storeBytes(describe.value().get(), 0)),
                   std::string(storeBytes(describe.value().get(), 1)),
                   {}};
  sqlite3_bind_int64(listTree.value().get(), 1, type);
  while (sqlite3_step(listTree.value().get()) == SQLITE_ROW) {
    found.tree.emplace_back(storeBytes(listTree.value().get(), 0));
  }
  return &types_.emplace(type, std::move(found)).first->second;
}

Result<std::optional<MetadataValue>> StoreReader::attribute(std::int64_t id, std::string_view name) {
  allowWork(kAllWork);
  auto found = item(id);
  if (!found) return found.error();
  using Value = std::optional<MetadataValue>;
  const StoredItem& item = found.value();
  const bool isRoot = id == kRootItem;
  if (name == kMDItemPath) {
    auto path = pathOf(id);
    if (!path) return path.error();
    return Value(std::move(path).value());
  }
  if (name == "kMDItemFSName") return Value(isRoot ? lastComponent(root_) : item.name);
  if (name == "kMDItemFSSize") {
    if (!item.size) return Value();
    return Value(*item.size);
  }
  if (name == "kMDItemFSContentChangeDate") {
    return Value(MetadataDate{static_cast<double>(item.mtime) / kNanosecondsPerSecond});
  }
  if (isRoot && name == kMDStoreLastHealthCheck) {
    if (!healthCheck_) return Value();
    return Value(MetadataDate{static_cast<double>(*healthCheck_)});
  }
  if (isRoot && name == kMDStoreAccumulatedSizes) {
    if (!healthCheck_) return Value();
    return Value(std::vector<std::int64_t>(accumulatedSizes_.begin(), accumulatedSizes_.end()));
  }
  return attributeOfType(item, name);
}

Result<std::optional<MetadataValue>> StoreReader::attributeOfType(const StoredItem& item,
                                                                  std::string_view name) {
  using Value = std::optional<MetadataValue>;
  const bool isIdentifier = name == "kMDItemContentType", isTree = name == "kMDItemContentTypeTree";
  if (!isIdentifier && !isTree && name != "kMDItemKind") return carried(item.id, name);
  const auto type = typeOf(item.type);
  if (!type) return type.error();
  if (isTree) return Value(type.value()->tree);
  return Value(isIdentifier ? type.value()->identifier : type.value()->kind);
}

Result<std::optional<MetadataValue>> StoreReader::carried(std::int64_t id, std::string_view name) {
  const Running running(carriedByName_);
  sqlite3_stmt* row = carriedByName_.get();
  sqlite3_bind_int64(row, 1, id);
  sqlite3_bind_text(row, 2, name.data(), static_cast<int>(name.size()), SQLITE_STATIC);
  const int status = sqlite3_step(row);
  if (status == SQLITE_DONE) return std::optional<MetadataValue>();
  if (status != SQLITE_ROW) return lastError();
  return valueOf(row, 0);
}

Result<std::vector<std::string>> StoreReader::carriedAttributes(std::int64_t id) {
  auto statement = prepare(
      "SELECT n.name FROM attribute_names AS n WHERE EXISTS "
      "(SELECT 1 FROM attributes WHERE name=n.id AND item=?) ORDER BY n.name");
  if (!statement) return statement.error();
  sqlite3_bind_int64(statement.value().get(), 1, id);
  std::vector<std::string> names;
  int status = SQLITE_ROW;
  while ((status = sqlite3_step(statement.value().get())) == SQLITE_ROW) {
    names.emplace_back(storeBytes(statement.value().get(), 0));
  }
  if (status != SQLITE_DONE) return lastError();
  return names;
}

}  // namespace norvex
