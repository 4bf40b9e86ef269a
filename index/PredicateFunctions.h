// What a connection to a store needs so that the SQL of a predicate runs on it.
//
// Called by whoever opens a store for queries, on the thread that uses the connection.
#pragma once

#include "index/PredicateSql.h"
#include "platform/Result.h"

struct sqlite3;
struct sqlite3_stmt;

namespace norvex {

// Makes the function of compiled predicates known to the connection, for its whole life:
// predicate_compare(value, operator, literal, ignores case, ignores diacritics). The error's code is
// SQLite's.
Result<void> registerPredicateFunctions(sqlite3* connection);

// Binds the values of a compiled predicate to its statement. Their bytes are copied. On failure some
// parameters may be bound; the error's code is SQLite's.
Result<void> bindPredicateValues(sqlite3_stmt* statement, const PredicateSql& sql);

// Binds the first and the last item that the statement looks at. The statement is not running.
void bindItemRange(sqlite3_stmt* statement, std::int64_t first, std::int64_t last);

}  // namespace norvex
