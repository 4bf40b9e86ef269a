#include "index/StoreWriter.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <thread>
#include <utility>
#include <variant>

#include "index/SparseAttributes.h"
#include "index/StoreSeal.h"
#include "platform/FileDescriptor.h"
#include "platform/Utf8.h"

namespace norvex {
namespace {

// The file is new and nobody else's: no journal, no locks, no syncs but the one before it is published.
constexpr const char* kWriterSettings =
    "PRAGMA page_size=8192; PRAGMA journal_mode=OFF; PRAGMA synchronous=OFF; PRAGMA locking_mode=EXCLUSIVE; "
    "PRAGMA cache_size=-4096";

// An index is sorted in as much memory as the cache has: it is to fit into the processor's own.
constexpr const char* kIndexSettings = "PRAGMA cache_size=-1024";

// Programs may carry names without end; those that come back are found in the store then.
constexpr std::size_t kMostRememberedNames = 1000;

constexpr int kInstructionsBetweenLooks = 100'000;

void bindText(sqlite3_stmt* statement, int index, std::string_view text) {
  sqlite3_bind_text(statement, index, text.data(), static_cast<int>(text.size()), SQLITE_STATIC);
}

// What is not UTF-8 is kept as bytes.
void bindValue(sqlite3_stmt* statement, int index, const MetadataValue& value) {
  if (const auto* whole = std::get_if<std::int64_t>(&value)) {
    sqlite3_bind_int64(statement, index, *whole);
  } else if (const auto* real = std::get_if<double>(&value)) {
    sqlite3_bind_double(statement, index, *real);
  } else if (const auto* text = std::get_if<std::string>(&value)) {
    const int length = static_cast<int>(text->size());
    if (isValidUtf8(*text) && text->find('\0') == std::string::npos) {
      sqlite3_bind_text(statement, index, text->data(), length, SQLITE_STATIC);
    } else {
      sqlite3_bind_blob(statement, index, text->data(), length, SQLITE_STATIC);
    }
  }
}

std::string joined(const AccumulatedSizes::Values& sizes) {
  std::string text;
  for (const std::int64_t size : sizes) text += (text.empty() ? "" : " ") + std::to_string(size);
  return text;
}

void watch(StoreDatabase& database, const std::atomic<bool>& cancelled) {
  const auto isCancelled = [](void* flag) {
    return static_cast<const std::atomic<bool>*>(flag)->load(std::memory_order_relaxed) ? 1 : 0;
  };
  sqlite3_progress_handler(database.handle(), kInstructionsBetweenLooks, isCancelled,
                           const_cast<std::atomic<bool>*>(&cancelled));
}

Result<std::string> firstText(StoreDatabase& database, const char* sql) {
  auto statement = database.prepare(sql);
  if (!statement) return statement.error();
  if (sqlite3_step(statement.value().get()) != SQLITE_ROW) return database.lastError();
  return std::string(storeBytes(statement.value().get(), 0));
}

// Another connection to the file, which has read what is in it now: the tables, but no index that is made
// afterwards.
Result<StoreDatabase> openForCheck(const std::string& path, const std::atomic<bool>& cancelled) {
  auto database = StoreDatabase::openImmutable(path);
  if (!database) return database;
  watch(database.value(), cancelled);
  if (const auto begun = database.value().run("BEGIN; SELECT count(*) FROM sqlite_schema"); !begun)
    return begun.error();
  return database;
}

// Whether every page is sound.
Result<void> checkPages(StoreDatabase& database) {
  const auto structure = firstText(database, "PRAGMA quick_check(1)");
  if (!structure) return structure.error();
  if (structure.value() != "ok") return damagedStore("the new one: " + structure.value());
  return {};
}

}  // namespace

StoreWriter::StoreWriter(std::string path, StoreDatabase database, const std::atomic<bool>& cancelled)
    : path_(std::move(path)), database_(std::move(database)), cancelled_(&cancelled) {}

Result<StoreWriter> StoreWriter::create(const std::string& path, const std::atomic<bool>& cancelled) {
  if (::unlink(path.c_str()) != 0 && errno != ENOENT) return systemError(errno);
  // Made here and not by SQLite, so that it is the user's alone from its first moment.
  if (!FileDescriptor(::open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC, 0600))) {
    return systemError(errno);
  }
  auto database = StoreDatabase::open(path, SQLITE_OPEN_READWRITE | SQLITE_OPEN_NOMUTEX);
  if (!database) return database.error();
  watch(database.value(), cancelled);
  StoreWriter writer(path, std::move(database).value(), cancelled);
  if (const auto begun = writer.begin(); !begun) return begun.error();
  return writer;
}

Result<void> StoreWriter::begin() {
  const std::string version = "PRAGMA user_version=" + std::to_string(kStoreSchemaVersion);
  for (const char* sql : {kWriterSettings, version.c_str(), "BEGIN"}) {
    if (auto run = database_->run(sql); !run) return run;
  }
  for (const StoreSchemaObject& object : kStoreSchema) {
    if (object.kind != "table") continue;
    if (auto made = database_->run(object.sql); !made) return made;
  }
  const std::pair<StoreStatement*, const char*> statements[] = {
      {&insertFolder_, "INSERT INTO folders VALUES(?,?,?,?)"},
      {&insertAttribute_, "INSERT OR REPLACE INTO attributes VALUES(?,?,?)"},
      {&insertFact_, "INSERT INTO facts VALUES(?,?)"},
      {&insertName_, "INSERT INTO attribute_names(name) VALUES(?)"},
      {&findName_, "SELECT id FROM attribute_names WHERE name=?"},
      {&listPending_,
       "SELECT id, name, type FROM items WHERE id>=? AND id<? AND id NOT IN (SELECT item FROM folders)"},
  };
  for (const auto& [statement, sql] : statements) {
    auto prepared = database_->prepare(sql);
    if (!prepared) return prepared.error();
    *statement = std::move(prepared).value();
  }
  auto items = StoreItemInserter::prepare(*database_);
  if (!items) return items.error();
  items_ = std::move(items).value();
  return {};
}

// The first failure is kept: the others follow from it.
void StoreWriter::note(bool isDone) {
  if (!isDone && !failure_) failure_ = database_->lastError();
}

void StoreWriter::step(sqlite3_stmt* statement) {
  note(sqlite3_step(statement) == SQLITE_DONE);
  sqlite3_reset(statement);
}

std::int64_t StoreWriter::add(const StoreItem& item) {
  note(items_->add(item));
  if (item.type >= usedTypes_.size()) usedTypes_.resize(std::size_t{item.type} + 1);
  usedTypes_[item.type] = true;
  return nextId_++;
}

void StoreWriter::addFolder(std::int64_t folder, std::int64_t firstChild, std::int64_t childCount,
                            StoreFolderState state) {
  sqlite3_stmt* statement = insertFolder_.get();
  sqlite3_bind_int64(statement, 1, folder);
  sqlite3_bind_int64(statement, 2, firstChild);
  sqlite3_bind_int64(statement, 3, childCount);
  sqlite3_bind_int64(statement, 4, static_cast<std::int64_t>(state));
  step(statement);
}

void StoreWriter::addAttribute(std::int64_t item, std::string_view name, std::string_view value) {
  sqlite3_stmt* statement = insertAttribute_.get();
  sqlite3_bind_int64(statement, 1, attributeNameId(name));
  sqlite3_bind_int64(statement, 2, item);
  const MetadataValue stored = parseSparseValue(value);
  bindValue(statement, 3, stored);
  step(statement);
}

std::int64_t StoreWriter::attributeNameId(std::string_view name) {
  const std::string key(name);
  if (const auto known = nameIds_.find(key); known != nameIds_.end()) return known->second;
  bindText(findName_.get(), 1, name);
  std::int64_t id = 0;
  if (sqlite3_step(findName_.get()) == SQLITE_ROW) id = sqlite3_column_int64(findName_.get(), 0);
  sqlite3_reset(findName_.get());
  if (id == 0) {
    bindText(insertName_.get(), 1, name);
    step(insertName_.get());
    id = sqlite3_last_insert_rowid(database_->handle());
  }
  if (nameIds_.size() >= kMostRememberedNames) nameIds_.clear();
  nameIds_.emplace(key, id);
  return id;
}

Result<std::vector<StoreSubfolder>> StoreWriter::pendingFolders(std::int64_t first, std::int64_t end,
                                                                std::size_t most,
                                                                const std::vector<bool>& isFolderType) {
  if (!items_->flush()) return database_->lastError();
  std::vector<StoreSubfolder> folders;
  sqlite3_stmt* statement = listPending_.get();
  sqlite3_bind_int64(statement, 1, first);
  sqlite3_bind_int64(statement, 2, end);
  int status = SQLITE_ROW;
  while (folders.size() < most && (status = sqlite3_step(statement)) == SQLITE_ROW) {
    const auto type = static_cast<TypeId>(sqlite3_column_int64(statement, 2));
    if (type >= isFolderType.size() || !isFolderType[type]) continue;
    const auto* name = static_cast<const char*>(sqlite3_column_blob(statement, 1));
    const auto length = static_cast<std::size_t>(sqlite3_column_bytes(statement, 1));
    folders.push_back({sqlite3_column_int64(statement, 0), std::string(name, length), type});
  }
  const bool failed = status != SQLITE_ROW && status != SQLITE_DONE;
  Result<std::vector<StoreSubfolder>> result =
      failed ? Result<std::vector<StoreSubfolder>>(database_->lastError())
             : Result<std::vector<StoreSubfolder>>(std::move(folders));
  sqlite3_reset(statement);
  return result;
}

Result<void> StoreWriter::status() const {
  if (failure_) return *failure_;
  return {};
}

void StoreWriter::addType(TypeId number, const ContentType& type) {
  const auto insertType = database_->prepare("INSERT INTO types VALUES(?,?,?)");
  const auto insertAncestor = database_->prepare("INSERT OR IGNORE INTO type_tree VALUES(?,?)");
  if (!insertType || !insertAncestor) {
    if (!failure_) failure_ = database_->lastError();
    return;
  }
  sqlite3_stmt* statement = insertType.value().get();
  sqlite3_bind_int64(statement, 1, number);
  bindText(statement, 2, type.identifier);
  bindText(statement, 3, type.kind);
  step(statement);
  for (const std::string& ancestor : type.tree) {
    bindText(insertAncestor.value().get(), 1, ancestor);
    sqlite3_bind_int64(insertAncestor.value().get(), 2, number);
    step(insertAncestor.value().get());
  }
}

void StoreWriter::setFact(std::string_view name, std::string_view text) {
  bindText(insertFact_.get(), 1, name);
  sqlite3_bind_blob(insertFact_.get(), 2, text.data(), static_cast<int>(text.size()), SQLITE_STATIC);
  step(insertFact_.get());
}

void StoreWriter::setFact(std::string_view name, std::int64_t number) {
  bindText(insertFact_.get(), 1, name);
  sqlite3_bind_int64(insertFact_.get(), 2, number);
  step(insertFact_.get());
}

Result<void> StoreWriter::writeFacts(const StoreVolumeFacts& facts) {
  note(items_->flush());
  setFact(kFactRoot, facts.root);
  setFact(kFactFileSystem, facts.fileSystem);
  setFact(kFactFiles, static_cast<std::int64_t>(facts.files));
  setFact(kFactFolders, static_cast<std::int64_t>(facts.folders));
  setFact(kFactUnreadable, static_cast<std::int64_t>(facts.unreadable));
  setFact(kFactAccumulatedSizes, joined(facts.accumulatedSizes));
  return status();
}

Result<void> StoreWriter::makeIndexes() {
  if (auto set = database_->run(kIndexSettings); !set) return set;
  for (const StoreSchemaObject& object : kStoreSchema) {
    if (object.kind != "index") continue;
    if (auto made = database_->run(object.sql); !made) return made;
  }
  return {};
}

// Two threads at once: the tables have been written, and what is added now does not touch their pages.
Result<void> StoreWriter::makeCheckedIndexes() {
  auto tables = openForCheck(path_, *cancelled_);
  if (!tables) return tables.error();
  Result<void> checked;
  std::thread check([&] { checked = checkPages(tables.value()); });
  const Result<void> made = makeIndexes();
  check.join();
  return checked ? made : checked;
}

Result<void> StoreWriter::checkCounts(std::uint64_t items) {
  for (const char* sql :
       {"SELECT count(*) FROM items NOT INDEXED", "SELECT count(*) FROM items INDEXED BY items_by_type"}) {
    const auto count = firstText(*database_, sql);
    if (!count) return count.error();
    if (count.value() != std::to_string(items)) {
      return damagedStore("the new one holds " + count.value() + " items instead of " +
                          std::to_string(items));
    }
  }
  return {};
}

Result<void> StoreWriter::closeAndSeal() {
  items_.reset();
  for (StoreStatement* statement :
       {&insertFolder_, &insertAttribute_, &insertFact_, &insertName_, &findName_, &listPending_}) {
    statement->reset();
  }
  database_.reset();
  const FileDescriptor file(::open(path_.c_str(), O_RDWR | O_CLOEXEC | O_NOFOLLOW));
  if (!file) return systemError(errno);
  return sealStore(file.number());
}

Result<void> StoreWriter::finish(const StoreVolumeFacts& facts, std::int64_t healthCheckTime) {
  if (auto written = writeFacts(facts); !written) return written;
  if (auto committed = database_->run("COMMIT"); !committed) return committed;
  if (auto made = makeCheckedIndexes(); !made) return made;
  if (auto checked = checkCounts(facts.files + facts.folders + 1); !checked) return checked;
  setFact(kFactHealthCheck, healthCheckTime);
  if (failure_) return *failure_;
  return closeAndSeal();
}

Result<void> StoreWriter::finishEmpty(const StoreVolumeFacts& facts) {
  if (auto written = writeFacts(facts); !written) return written;
  if (auto made = makeIndexes(); !made) return made;
  if (auto committed = database_->run("COMMIT"); !committed) return committed;
  return closeAndSeal();
}

}  // namespace norvex
