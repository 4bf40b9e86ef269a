// A predicate as SQL: the condition of a query over the items of a volume's store.
//
// Any thread. Pure. queryOf() makes the statement; it runs on a connection that registerPredicateFunctions
// (PredicateFunctions.h) has prepared, over a range of items, whose first and last number are its parameters
// 1 and 2. What it expects there:
//
//   items i(id INTEGER PRIMARY KEY, parent INTEGER, name BLOB, type INTEGER, size INTEGER, mtime INTEGER)
//     size is NULL for folders; mtime counts nanoseconds since 1970; name is never NULL
//   types(id INTEGER PRIMARY KEY, identifier TEXT, kind TEXT)
//   type_tree(type INTEGER, ancestor TEXT)   each type with itself and everything it conforms to
//   attribute_names(id INTEGER PRIMARY KEY, name TEXT UNIQUE)
//   attributes(name INTEGER, item INTEGER, value, PRIMARY KEY(name, item)) WITHOUT ROWID
//     a value that numberFromText (NumberText.h) reads is stored as that number, every other as TEXT or BLOB
//   path_of(id)                              a function: the item's path, TEXT or BLOB
//
// An index on items(type) serves the tests of types, from the range's first item on. The tests of attributes
// that only some items have start from `attributes`; its primary key serves them. The store keeps no
// statistics (ANALYZE): with them SQLite takes a list of types for 25 average types, and on a store of few
// types reads every item instead.
//
// kMDItemFSContentChangeDate is the number of seconds since 1970 as the double mtime / 1e9.
#pragma once

#include <cstdint>
#include <string>
#include <variant>
#include <vector>

#include "index/Predicate.h"

namespace norvex {

// Bytes to be bound as TEXT, and bytes to be bound as BLOB.
struct SqlText {
  std::string bytes;
};
struct SqlBlob {
  std::string bytes;
};
using SqlValue = std::variant<std::int64_t, double, SqlText, SqlBlob>;

struct PredicateSql {
  // True for the items that match, false or NULL for the others. Holds nothing of the predicate's own text:
  // attribute names and values are bound. For the items of the range only.
  std::string where;
  // For the parameters of `where`, one "?" each, in their order, behind those of the range.
  std::vector<SqlValue> values;
};

// Compiles any predicate that the parser yields; never fails.
PredicateSql compilePredicate(const Predicate& predicate);

// The statement that finds the matches: their ids in any order.
std::string queryOf(const PredicateSql& sql);

}  // namespace norvex
