#include "index/StoreItemInserter.h"

#include <sqlite3.h>

namespace norvex {
namespace {

// SQLite gives the ids, which saves it the look whether one is taken: they count up from the root's.
constexpr const char* kInsert = "INSERT INTO items(parent, name, type, size, mtime) VALUES(?,?,?,?,?)";
constexpr const char* kFurtherRow = ",(?,?,?,?,?)";
constexpr int kParameters = 5;

bool run(sqlite3_stmt* statement) {
  const bool isDone = sqlite3_step(statement) == SQLITE_DONE;
  sqlite3_reset(statement);
  return isDone;
}

}  // namespace

Result<StoreItemInserter> StoreItemInserter::prepare(StoreDatabase& database) {
  std::string many = kInsert;
  for (std::size_t row = 1; row < kRows; ++row) many += kFurtherRow;
  StoreItemInserter inserter;
  for (const auto& [statement, sql] :
       {std::pair(&inserter.insertOne_, kInsert), std::pair(&inserter.insertMany_, many.c_str())}) {
    auto prepared = database.prepare(sql);
    if (!prepared) return prepared.error();
    *statement = std::move(prepared).value();
  }
  return inserter;
}

bool StoreItemInserter::add(const StoreItem& item) {
  rows_[count_++] = {item.parent, item.type, item.mtime, item.size, names_.size(), item.name.size()};
  names_.append(item.name);
  return count_ < kRows || flush();
}

bool StoreItemInserter::flush() {
  bool isWritten = true;
  if (count_ == kRows) {
    for (std::size_t row = 0; row < kRows; ++row)
      bind(insertMany_.get(), static_cast<int>(row) * kParameters + 1, rows_[row]);
    isWritten = run(insertMany_.get());
  } else {
    for (std::size_t row = 0; row < count_ && isWritten; ++row) {
      bind(insertOne_.get(), 1, rows_[row]);
      isWritten = run(insertOne_.get());
    }
  }
  count_ = 0;
  names_.clear();
  return isWritten;
}

void StoreItemInserter::bind(sqlite3_stmt* statement, int parameter, const Row& row) const {
  sqlite3_bind_int64(statement, parameter, row.parent);
  sqlite3_bind_blob(statement, parameter + 1, names_.data() + row.nameStart, static_cast<int>(row.nameLength),
                    SQLITE_STATIC);
  sqlite3_bind_int64(statement, parameter + 2, row.type);
  if (row.size) {
    sqlite3_bind_int64(statement, parameter + 3, *row.size);
  } else {
    sqlite3_bind_null(statement, parameter + 3);
  }
  sqlite3_bind_int64(statement, parameter + 4, row.mtime);
}

}  // namespace norvex
