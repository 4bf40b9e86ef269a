#include "index/StoreDatabase.h"

#include <array>
#include <cstdio>

namespace norvex {
namespace {

std::string uriOf(const std::string& path) {
  static constexpr std::string_view kPlain =
      "abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789/-_.";
  std::string uri = "file:";
  std::array<char, 8> piece{};
  for (const char letter : path) {
    if (kPlain.find(letter) != std::string_view::npos) {
      uri += letter;
      continue;
    }
    std::snprintf(piece.data(), piece.size(), "%%%02X", static_cast<unsigned char>(letter));
    uri += piece.data();
  }
  return uri + "?immutable=1";
}

}  // namespace

Error damagedStore(const std::string& what) {
  return Error{kStoreDamaged, "the store is damaged (" + what + "); `norvexctl index update` makes it anew"};
}

std::string_view storeBytes(sqlite3_stmt* row, int column) {
  const auto* bytes = static_cast<const char*>(sqlite3_column_blob(row, column));
  return {bytes == nullptr ? "" : bytes, static_cast<std::size_t>(sqlite3_column_bytes(row, column))};
}

Result<StoreDatabase> StoreDatabase::open(const std::string& path, int flags) {
  sqlite3* connection = nullptr;
  const int status = sqlite3_open_v2(path.c_str(), &connection, flags, nullptr);
  StoreDatabase database(connection);  // SQLite gives a handle also when it fails
  if (connection == nullptr) return systemError(ENOMEM);
  if (status != SQLITE_OK) return database.lastError();
  sqlite3_extended_result_codes(connection, 1);
  return database;
}

Result<StoreDatabase> StoreDatabase::openImmutable(const std::string& path) {
  return open(uriOf(path),
              SQLITE_OPEN_READONLY | SQLITE_OPEN_URI | SQLITE_OPEN_FULLMUTEX | SQLITE_OPEN_PRIVATECACHE);
}

Result<void> StoreDatabase::run(const char* sql) {
  if (sqlite3_exec(connection_.get(), sql, nullptr, nullptr, nullptr) != SQLITE_OK) return lastError();
  return {};
}

Result<StoreStatement> StoreDatabase::prepare(std::string_view sql) {
  sqlite3_stmt* statement = nullptr;
  const int status = sqlite3_prepare_v3(connection_.get(), sql.data(), static_cast<int>(sql.size()),
                                        SQLITE_PREPARE_PERSISTENT, &statement, nullptr);
  if (status != SQLITE_OK) return lastError();
  return StoreStatement(statement);
}

Error StoreDatabase::lastError() const {
  const std::string text = sqlite3_errmsg(connection_.get());
  switch (sqlite3_errcode(connection_.get()) & 0xff) {
    case SQLITE_FULL:
      return systemError(ENOSPC);
    case SQLITE_NOMEM:
      return systemError(ENOMEM);
    case SQLITE_INTERRUPT:
      return systemError(ECANCELED);
    case SQLITE_CORRUPT:
    case SQLITE_NOTADB:
      return damagedStore(text);
    case SQLITE_IOERR:
    case SQLITE_CANTOPEN:
      if (const int code = sqlite3_system_errno(connection_.get()); code != 0) return systemError(code);
      return Error{EIO, text};
    default:
      return Error{EIO, text};
  }
}

}  // namespace norvex
