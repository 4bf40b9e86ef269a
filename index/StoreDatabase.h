// A connection to one store file and its prepared statements, as scope objects whose failures are Errors.
//
// Used by the store's writer and reader. A connection belongs to one thread at a time.
#pragma once

#include <sqlite3.h>

#include <cerrno>
#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

#include "platform/Result.h"

namespace norvex {

struct StoreStatementCloser {
  void operator()(sqlite3_stmt* statement) const { sqlite3_finalize(statement); }
};
using StoreStatement = std::unique_ptr<sqlite3_stmt, StoreStatementCloser>;

// What is wrong with a store, as the code of an Error.
inline constexpr int kStoreMissing = ENOENT;   // there is none, or it is another volume's
inline constexpr int kStoreDamaged = EBADMSG;  // its bytes are not those that were written, or make no sense
inline constexpr int kStoreTooNew = EPROTONOSUPPORT;  // a later version of this program wrote it

// The Error of a store of which `what` is wrong.
Error damagedStore(const std::string& what);

class StoreDatabase {
 public:
  // Opens `path` with SQLite's open flags. Reads nothing yet.
  static Result<StoreDatabase> open(const std::string& path, int flags);

  // Opens a file whose pages do not change any more, to read it. Takes no locks. Reads nothing yet.
  static Result<StoreDatabase> openImmutable(const std::string& path);

  // Runs statements that give no rows.
  Result<void> run(const char* sql);

  Result<StoreStatement> prepare(std::string_view sql);

  // The last failure of this connection. A full disk is ENOSPC, damaged content kStoreDamaged, a failed read
  // or write its errno.
  Error lastError() const;

  sqlite3* handle() const { return connection_.get(); }

 private:
  struct Closer {
    void operator()(sqlite3* connection) const { sqlite3_close_v2(connection); }
  };
  explicit StoreDatabase(sqlite3* connection) : connection_(connection) {}

  std::unique_ptr<sqlite3, Closer> connection_;
};

// The bytes of a text or blob in the current row; valid until the statement moves on. NULL gives none.
std::string_view storeBytes(sqlite3_stmt* row, int column);

}  // namespace norvex
