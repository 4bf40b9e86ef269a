#include "index/StoreReader.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <charconv>
#include <cstring>
#include <span>
#include <utility>

#include "index/CrawlVolume.h"
#include "index/StoreSeal.h"
#include "platform/Utf8.h"

namespace norvex {
namespace {

constexpr int kLongestValue = 8 * 1024 * 1024;
constexpr int kInstructionsPerUnit = 1000;

// What a statement may do: far more than any question over an honest store takes, and over within seconds.
constexpr std::int64_t kWorkUnits = 500'000;
constexpr std::int64_t kBytesPerWorkUnit = 20;

constexpr std::size_t kHeaderBytes = 100;
constexpr std::string_view kHeaderMagic("SQLite format 3\0", 16);
constexpr std::size_t kUserVersionOffset = 60;

std::optional<std::int64_t> numberOf(std::string_view text) {
  std::int64_t number = 0;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  if (error != std::errc{} || end != text.data() + text.size()) return std::nullopt;
  return number;
}

// Of how many updates that are published meanwhile an opening takes the newer store instead.
constexpr int kMostOpenings = 10;

bool areSameFile(const struct stat& left, const struct stat& right) {
  return left.st_dev == right.st_dev && left.st_ino == right.st_ino;
}

}  // namespace

StoreReader::~StoreReader() = default;

Result<std::unique_ptr<StoreReader>> StoreReader::open(const StoreFolder& folder, std::string_view volumeRoot,
                                                       Check check) {
  const std::string root = normalizedVolumeRoot(volumeRoot);
  auto opened = openFile(folder.storePath(root));
  if (!opened) return opened.error();
  std::unique_ptr<StoreReader> reader(new StoreReader(std::move(opened.value().database)));
  if (const auto checked = reader->checkFile(opened.value().file.number(), check); !checked)
    return checked.error();
  if (reader->isOlder_) return openEmpty(root);
  for (const auto step : {&StoreReader::harden, &StoreReader::checkSchema, &StoreReader::readFacts,
                          &StoreReader::makeStatements, &StoreReader::registerFunctions}) {
    if (const auto done = (reader.get()->*step)(); !done) return done.error();
  }
  if (reader->root_ != root) return damagedStore("it is of another volume");
  const auto mounted = fileSystemIdAt(root);
  if (!mounted) return mounted.error();
  if (mounted.value() != reader->fileSystem_) {
    return Error{kStoreMissing, "another file system is mounted there than the one that was indexed"};
  }
  return reader;
}

// What is checked is read through a descriptor of its own, and is the file that SQLite has opened: the path
// named it before and after that. Another store may take the path at any moment.
Result<StoreReader::OpenedFile> StoreReader::openFile(const std::string& path) {
  for (int opening = 0; opening < kMostOpenings; ++opening) {
    struct stat status {};
    if (::lstat(path.c_str(), &status) != 0) return systemError(errno);
    if (!S_ISREG(status.st_mode))
      return damagedStore("no regular file");  // opening a pipe would wait for its other end
    FileDescriptor file(::open(path.c_str(), O_RDONLY | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC));
    if (!file) return systemError(errno);
    if (::fstat(file.number(), &status) != 0) return systemError(errno);
    auto database = StoreDatabase::openImmutable(path);
    if (!database) return database.error();
    struct stat afterwards {};
    if (::lstat(path.c_str(), &afterwards) != 0) return systemError(errno);
    if (areSameFile(status, afterwards)) return OpenedFile{std::move(file), std::move(database).value()};
  }
  return systemError(EAGAIN);
}

// Nothing is left of the old store but that there is one.
Result<std::unique_ptr<StoreReader>> StoreReader::openEmpty(const std::string& root) {
  auto database = StoreDatabase::open(":memory:", SQLITE_OPEN_READWRITE | SQLITE_OPEN_FULLMUTEX);
  if (!database) return database.error();
  for (const StoreSchemaObject& object : kStoreSchema) {
    if (const auto made = database.value().run(object.sql); !made) return made.error();
  }
  const char* rows =
      "INSERT INTO items VALUES(1, 0, x'', 0, NULL, 0); INSERT INTO types VALUES(0, 'public.folder', "
      "'Folder'); "
      "INSERT INTO type_tree VALUES('public.folder', 0), ('public.item', 0)";
  if (const auto made = database.value().run(rows); !made) return made.error();
  std::unique_ptr<StoreReader> reader(new StoreReader(std::move(database).value()));
  reader->root_ = root;
  reader->mostWork_ = kWorkUnits;
  if (const auto made = reader->makeStatements(); !made) return made.error();
  if (const auto made = reader->registerFunctions(); !made) return made.error();
  return reader;
}

Result<void> StoreReader::checkFile(int file, Check check) {
  struct stat status {};
  if (::fstat(file, &status) != 0) return systemError(errno);
  std::array<unsigned char, kHeaderBytes> header{};
  if (::pread(file, header.data(), header.size(), 0) != static_cast<ssize_t>(header.size()))
    return damagedStore("it ends too early");
  if (std::memcmp(header.data(), kHeaderMagic.data(), kHeaderMagic.size()) != 0)
    return damagedStore("it is no store");
  const std::span<const unsigned char, 4> versionBytes = std::span(header).subspan<kUserVersionOffset, 4>();
  std::int64_t version = 0;
  for (const unsigned char byte : versionBytes) version = version << 8 | byte;
  if (version > kStoreSchemaVersion) {
    return Error{kStoreTooNew,
                 "a later version of this program wrote the store; `norvexctl index update` makes it anew"};
  }
  isOlder_ = version < kStoreSchemaVersion;
  mostWork_ = kWorkUnits + status.st_size / kBytesPerWorkUnit;
  if (isOlder_ || check == Check::factsOnly) return {};
  return checkStoreSeal(file);
}

Result<void> StoreReader::harden() {
  sqlite3* connection = database_.handle();
  sqlite3_db_config(connection, SQLITE_DBCONFIG_DEFENSIVE, 1, nullptr);
  sqlite3_db_config(connection, SQLITE_DBCONFIG_TRUSTED_SCHEMA, 0, nullptr);
  sqlite3_db_config(connection, SQLITE_DBCONFIG_ENABLE_TRIGGER, 0, nullptr);
  sqlite3_db_config(connection, SQLITE_DBCONFIG_ENABLE_VIEW, 0, nullptr);
  sqlite3_db_config(connection, SQLITE_DBCONFIG_DQS_DML, 0, nullptr);
  sqlite3_limit(connection, SQLITE_LIMIT_LENGTH, kLongestValue);
  sqlite3_limit(connection, SQLITE_LIMIT_ATTACHED, 0);
  const auto count = [](void* reader) { return static_cast<StoreReader*>(reader)->countWork(); };
  sqlite3_progress_handler(connection, kInstructionsPerUnit, count, this);
  allowWork(kAllWork);
  return database_.run(
      "PRAGMA cell_size_check=ON; PRAGMA mmap_size=0; PRAGMA query_only=ON; PRAGMA cache_size=-2048");
}

int StoreReader::countWork() {
  return --workLeft_ < 0 ? 1 : 0;
}

// A view in the place of a table, or a column that is computed, could do anything.
Result<void> StoreReader::checkSchema() {
  auto statement = prepare("SELECT type, name, sql FROM sqlite_schema WHERE sql IS NOT NULL ORDER BY rowid");
  if (!statement) return damagedStore(statement.error().description);
  sqlite3_stmt* rows = statement.value().get();
  for (const StoreSchemaObject& object : kStoreSchema) {
    if (sqlite3_step(rows) != SQLITE_ROW || storeBytes(rows, 0) != object.kind ||
        storeBytes(rows, 1) != object.name || storeBytes(rows, 2) != object.sql) {
      return damagedStore("its tables are not a store's");
    }
  }
  if (sqlite3_step(rows) != SQLITE_DONE) return damagedStore("its tables are not a store's");
  return {};
}

std::optional<std::string> StoreReader::fact(std::string_view name) {
  auto statement = prepare("SELECT value FROM facts WHERE name=?");
  if (!statement) return std::nullopt;
  sqlite3_stmt* row = statement.value().get();
  sqlite3_bind_text(row, 1, name.data(), static_cast<int>(name.size()), SQLITE_STATIC);
  if (sqlite3_step(row) != SQLITE_ROW) return std::nullopt;
  return std::string(storeBytes(row, 0));
}

Result<void> StoreReader::readFacts() {
  const auto number = [this](std::string_view name) -> std::optional<std::int64_t> {
    const auto text = fact(name);
    const auto value = text ? numberOf(*text) : std::nullopt;
    return value && *value >= 0 ? value : std::nullopt;
  };
  const auto rootText = fact(kFactRoot);
  const auto fileSystem = fact(kFactFileSystem);
  const auto files = number(kFactFiles), folders = number(kFactFolders), unreadable = number(kFactUnreadable);
  const auto sizes = fact(kFactAccumulatedSizes);
  if (!rootText || !fileSystem || !files || !folders || !unreadable || !sizes)
    return damagedStore("a fact is missing");
  root_ = *rootText;
  fileSystem_ = *fileSystem;
  counts_ = {static_cast<std::uint64_t>(*files), static_cast<std::uint64_t>(*folders),
             static_cast<std::uint64_t>(*unreadable)};
  std::string_view rest = *sizes;
  for (std::int64_t& size : accumulatedSizes_) {
    const std::size_t end = std::min(rest.find(' '), rest.size());
    const auto value = numberOf(rest.substr(0, end));
    if (!value || *value < 0) return damagedStore("an accumulated size makes no sense");
    size = *value;
    rest.remove_prefix(std::min(end + 1, rest.size()));
  }
  if (!fact(kFactHealthCheck)) return {};
  healthCheck_ = number(kFactHealthCheck);
  if (!healthCheck_) return damagedStore("the moment of its check makes no sense");
  return {};
}

Result<void> StoreReader::makeStatements() {
  const std::pair<StoreStatement*, const char*> statements[] = {
      {&itemById_, "SELECT parent, name, type, size, mtime FROM items WHERE id=?"},
      {&folderById_, "SELECT first_child, child_count, state FROM folders WHERE item=?"},
      {&childByName_, "SELECT id FROM items WHERE id>=? AND id<? AND parent=? AND name=?"},
      {&carriedByName_,
       "SELECT value FROM attributes WHERE item=? AND name=(SELECT id FROM attribute_names WHERE name=?)"},
  };
  for (const auto& [statement, sql] : statements) {
    auto prepared = prepare(sql);
    if (!prepared) return prepared.error();
    *statement = std::move(prepared).value();
  }
  return {};
}

Result<StoreStatement> StoreReader::prepare(std::string_view sql) {
  allowWork(kAllWork);
  return database_.prepare(sql);
}

void StoreReader::allowWork(std::int64_t units) {
  workAllowed_ = workLeft_ = std::min(units, mostWork_);
}

std::optional<StoreCounts> StoreReader::counts() const {
  return healthCheck_ ? std::optional(counts_) : std::nullopt;
}

std::optional<AccumulatedSizes::Values> StoreReader::accumulatedSizes() const {
  return healthCheck_ ? std::optional(accumulatedSizes_) : std::nullopt;
}

}  // namespace norvex
