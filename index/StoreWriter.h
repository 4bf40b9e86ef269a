// Writes one new store: the items in the order in which the crawl meets them, then what is known about the
// volume.
//
// Used by one update, on its thread. Nothing that it writes is seen before finish() has succeeded and the
// file has been published. Memory does not grow with the number of items.
#pragma once

#include <atomic>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "index/AccumulatedSizes.h"
#include "index/ContentTypes.h"
#include "index/StoreDatabase.h"
#include "index/StoreItem.h"
#include "index/StoreItemInserter.h"
#include "index/StoreSchema.h"
#include "platform/Result.h"

namespace norvex {

struct StoreVolumeFacts {
  std::string root;
  std::string fileSystem;
  std::uint64_t files = 0;
  std::uint64_t folders = 0;
  std::uint64_t unreadable = 0;
  AccumulatedSizes::Values accumulatedSizes{};
};

struct StoreSubfolder {
  std::int64_t id = 0;
  std::string name;
  TypeId type = 0;
};

class StoreWriter {
 public:
  // Makes the file anew, replacing what is there. `cancelled` ends the longer steps; it outlives the writer.
  static Result<StoreWriter> create(const std::string& path, const std::atomic<bool>& cancelled);

  // Adds the next item and gives its id: the first is the root, each following one is higher by one. A
  // failure is told by status() and by finish().
  std::int64_t add(const StoreItem& item);
  std::int64_t nextId() const { return nextId_; }

  // Where the children of a folder stand.
  void addFolder(std::int64_t folder, std::int64_t firstChild, std::int64_t childCount,
                 StoreFolderState state);

  // A value that is a number is kept as one. Replaces what the item has under this name.
  void addAttribute(std::int64_t item, std::string_view name, std::string_view value);

  // The folders among the items [first, end) that have no folder row yet, at most `most`. `isFolder` tells it
  // of a type.
  Result<std::vector<StoreSubfolder>> pendingFolders(std::int64_t first, std::int64_t end, std::size_t most,
                                                     const std::vector<bool>& isFolderType);

  // Success as long as nothing has failed.
  Result<void> status() const;

  // Which types occur, by the numbers that were given to add().
  const std::vector<bool>& usedTypes() const { return usedTypes_; }
  void addType(TypeId number, const ContentType& type);

  // Writes the facts, makes the index, has the store checked, stamps the moment of the check and seals the
  // file. The writer is of no more use afterwards.
  Result<void> finish(const StoreVolumeFacts& facts, std::int64_t healthCheckTime);

  // The same without a check and its stamp: for a store that says only that its volume's first update is
  // under way.
  Result<void> finishEmpty(const StoreVolumeFacts& facts);

 private:
  StoreWriter(std::string path, StoreDatabase database, const std::atomic<bool>& cancelled);

  Result<void> begin();
  Result<void> writeFacts(const StoreVolumeFacts& facts);
  Result<void> makeIndexes();
  Result<void> makeCheckedIndexes();
  Result<void> checkCounts(std::uint64_t items);
  Result<void> closeAndSeal();
  std::int64_t attributeNameId(std::string_view name);
  void setFact(std::string_view name, std::string_view text);
  void setFact(std::string_view name, std::int64_t number);
  void step(sqlite3_stmt* statement);
  void note(bool isDone);

  std::string path_;
  std::optional<StoreDatabase> database_;
  std::optional<StoreItemInserter> items_;
  StoreStatement insertFolder_, insertAttribute_, insertFact_, insertName_, findName_, listPending_;
  std::unordered_map<std::string, std::int64_t> nameIds_;
  std::vector<bool> usedTypes_;
  std::int64_t nextId_ = kRootItem;
  const std::atomic<bool>* cancelled_;
  std::optional<Error> failure_;
};

}  // namespace norvex
