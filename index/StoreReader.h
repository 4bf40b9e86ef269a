// Reads one published store: the items of a volume by path or number, their attributes, and the volume's
// figures.
//
// Used by the index's queries and items. Belongs to one thread at a time. Holds the snapshot that it opened,
// whatever is published meanwhile. Nothing that a file may hold makes it crash or go on for ever: what makes
// no sense is an Error with the code kStoreDamaged.
#pragma once

#include <cstdint>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "index/AccumulatedSizes.h"
#include "index/StoreDatabase.h"
#include "index/StoreFolder.h"
#include "index/StoreSchema.h"
#include "platform/FileDescriptor.h"
#include "platform/MetadataIndex.h"
#include "platform/Result.h"

namespace norvex {

struct StoredItem {
  std::int64_t id = 0;
  std::int64_t parent = 0;  // 0: it is the volume's root
  std::string name;         // empty for the root
  std::int64_t type = 0;
  std::optional<std::int64_t> size;  // bytes; none for folders
  std::int64_t mtime = 0;            // nanoseconds since 1970
};

struct StoredType {
  std::string identifier;
  std::string kind;
  std::vector<std::string> tree;
};

struct StoreCounts {
  std::uint64_t files = 0;    // everything that is no folder, under each of its names
  std::uint64_t folders = 0;  // without the volume's root
  std::uint64_t unreadable = 0;
};

class StoreReader {
 public:
  // How much of a store is looked at before it is believed: every byte, or only what identifies it.
  enum class Check { wholeFile, factsOnly };

  // Opens the store of a volume. Errors: kStoreMissing when there is none or what is mounted there now is
  // another file system; kStoreDamaged; kStoreTooNew; or the errno of a failed read. A store of an older
  // version of this program reads as one whose first update is under way: no items but the root, no health
  // check.
  static Result<std::unique_ptr<StoreReader>> open(const StoreFolder& folder, std::string_view volumeRoot,
                                                   Check check = Check::wholeFile);

  ~StoreReader();
  StoreReader(const StoreReader&) = delete;
  StoreReader& operator=(const StoreReader&) = delete;

  const std::string& root() const { return root_; }

  // Seconds since 1970 at which the store passed its check; none while the volume's first update is under
  // way. The counts and sizes are then none either.
  std::optional<std::int64_t> healthCheck() const { return healthCheck_; }
  std::optional<StoreCounts> counts() const;
  std::optional<AccumulatedSizes::Values> accumulatedSizes() const;

  // The item of a path below the volume's root, which is empty itself; no item is no failure.
  Result<std::optional<std::int64_t>> itemAt(std::string_view path);

  Result<StoredItem> item(std::int64_t id);

  // Absolute. In SQL: path_of(id), TEXT where it is UTF-8 and BLOB where not.
  Result<std::string> pathOf(std::int64_t id);

  // The attributes that every item has, those of the volume's root, and those that this item carries. None
  // when the item has no such attribute.
  Result<std::optional<MetadataValue>> attribute(std::int64_t id, std::string_view name);

  // The names of the attributes that the item carries besides those that every item has.
  Result<std::vector<std::string>> carriedAttributes(std::int64_t id);

  // A statement over the tables of StoreSchema.h, which may also use path_of() and what predicates need
  // (PredicateFunctions.h). All that is run until the next call shares one bound on its work; a store that
  // would take more of it is damaged.
  Result<StoreStatement> prepare(std::string_view sql);

  // Bounds what is run from now on to so much work, in thousands of SQLite's instructions, and at most to
  // what an honest store may take. A statement that would take more fails.
  static constexpr std::int64_t kAllWork = INT64_MAX;
  void allowWork(std::int64_t units);
  std::int64_t workDone() const { return workAllowed_ - workLeft_; }  // since then
  bool isWorkUsedUp() const { return workLeft_ < 0; }

  Error lastError() const { return database_.lastError(); }
  sqlite3* connection() const { return database_.handle(); }

 private:
  explicit StoreReader(StoreDatabase database) : database_(std::move(database)) {}

  static Result<std::unique_ptr<StoreReader>> openEmpty(const std::string& root);
  Result<void> harden();
  struct OpenedFile {
    FileDescriptor file;  // the same file as SQLite's
    StoreDatabase database;
  };
  static Result<OpenedFile> openFile(const std::string& path);
  Result<void> checkFile(int file, Check check);
  Result<void> checkSchema();
  Result<void> readFacts();
  Result<void> makeStatements();
  Result<void> registerFunctions();
  Result<std::optional<std::int64_t>> childNamed(std::int64_t folder, std::string_view name);
  Result<std::optional<std::int64_t>> searchSorted(std::int64_t folder, std::int64_t first,
                                                   std::int64_t count, std::string_view name);
  Result<std::optional<std::int64_t>> searchUnsorted(std::int64_t folder, std::int64_t first,
                                                     std::int64_t count, std::string_view name);
  Result<std::string> climb(std::int64_t folder);
  Result<const StoredType*> typeOf(std::int64_t type);
  Result<std::optional<MetadataValue>> attributeOfType(const StoredItem& item, std::string_view name);
  Result<std::optional<MetadataValue>> carried(std::int64_t id, std::string_view name);
  std::optional<std::string> fact(std::string_view name);
  int countWork();

  StoreDatabase database_;
  std::string root_, fileSystem_;
  std::optional<std::int64_t> healthCheck_;
  StoreCounts counts_;
  AccumulatedSizes::Values accumulatedSizes_{};
  bool isOlder_ = false;
  // In thousands of SQLite's instructions.
  std::int64_t workAllowed_ = 0, workLeft_ = 0, mostWork_ = 0;
  StoreStatement itemById_, folderById_, childByName_, carriedByName_;
  std::map<std::int64_t, StoredType> types_;

  // The path asked for last, and of which folder: neighbours in the index mostly have the same.
  std::int64_t lastFolder_ = 0;
  std::string lastFolderPath_;
};

}  // namespace norvex
