// Inserts the items of a new store, many with one statement: to begin and to end a statement costs SQLite
// more than the row itself.
//
// Used by the store's writer, on its thread. Keeps kRows items at most.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>

#include "index/StoreDatabase.h"
#include "index/StoreItem.h"
#include "platform/Result.h"

namespace norvex {

class StoreItemInserter {
 public:
  // For the database that the statements are made for; it outlives this object.
  static Result<StoreItemInserter> prepare(StoreDatabase& database);

  // Takes a copy of the next item. False when items could not be written: the database knows why.
  bool add(const StoreItem& item);

  // Writes what has been added so far. To be called before anything reads the items.
  bool flush();

 private:
  static constexpr std::size_t kRows = 32;

  struct Row {
    std::int64_t parent, type, mtime;
    std::optional<std::int64_t> size;
    std::size_t nameStart, nameLength;
  };

  void bind(sqlite3_stmt* statement, int firstParameter, const Row& row) const;

  StoreStatement insertOne_, insertMany_;
  std::array<Row, kRows> rows_{};
  std::size_t count_ = 0;
  std::string names_;
};

}  // namespace norvex
