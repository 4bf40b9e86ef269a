#include "index/PredicateFunctions.h"

#include <sqlite3.h>

#include <memory>
#include <new>
#include <optional>
#include <string_view>

#include "index/ValueComparison.h"

namespace norvex {
namespace {

enum Argument { kValue, kOperator, kLiteral, kIgnoresCase, kIgnoresDiacritics, kArgumentCount };

// The parameters of a predicate's statement.
enum Parameter { kFirstItem = 1, kLastItem, kFirstValue };

Error sqliteError(int code) {
  return Error{code, sqlite3_errstr(code)};
}

std::string_view bytesOf(sqlite3_value* value) {
  // Its bytes are asked for before its length: the call may move them.
  const void* const bytes = sqlite3_value_type(value) == SQLITE_TEXT
                                ? static_cast<const void*>(sqlite3_value_text(value))
                                : sqlite3_value_blob(value);
  const auto length = static_cast<std::size_t>(sqlite3_value_bytes(value));
  return bytes == nullptr ? std::string_view() : std::string_view(static_cast<const char*>(bytes), length);
}

// Absent for NULL.
std::optional<PredicateValueView> viewOf(sqlite3_value* value) {
  switch (sqlite3_value_type(value)) {
    case SQLITE_INTEGER:
      return sqlite3_value_int64(value);
    case SQLITE_FLOAT:
      return sqlite3_value_double(value);
    case SQLITE_TEXT:
    case SQLITE_BLOB:
      return bytesOf(value);
    default:
      return std::nullopt;
  }
}

PredicateOperator operatorOf(std::string_view spelling) {
  if (spelling == "<") return PredicateOperator::Less;
  if (spelling == "<=") return PredicateOperator::LessOrEqual;
  if (spelling == ">") return PredicateOperator::Greater;
  if (spelling == ">=") return PredicateOperator::GreaterOrEqual;
  return PredicateOperator::Equal;
}

PredicateLiteral literalOf(sqlite3_value** arguments) {
  sqlite3_value* const literal = arguments[kLiteral];
  switch (sqlite3_value_type(literal)) {
    case SQLITE_INTEGER:
      return PlainNumber(std::int64_t{sqlite3_value_int64(literal)});
    case SQLITE_FLOAT:
      return PlainNumber(sqlite3_value_double(literal));
    default:
      return patternFromSource(bytesOf(literal), {sqlite3_value_int(arguments[kIgnoresCase]) != 0,
                                                  sqlite3_value_int(arguments[kIgnoresDiacritics]) != 0});
  }
}

// Everything but the value is the same for every row of a statement. It is made ready once and then kept by
// SQLite, with the literal.
void compareValue(sqlite3_context* context, sqlite3_value** arguments) {
  const auto value = viewOf(arguments[kValue]);
  if (!value) return sqlite3_result_null(context);
  if (const void* const kept = sqlite3_get_auxdata(context, kLiteral)) {
    return sqlite3_result_int(context, static_cast<const ValueComparison*>(kept)->holdsFor(*value) ? 1 : 0);
  }
  auto comparison = std::make_unique<ValueComparison>(
      PredicateCondition{operatorOf(bytesOf(arguments[kOperator])), literalOf(arguments)});
  sqlite3_result_int(context, comparison->holdsFor(*value) ? 1 : 0);
  sqlite3_set_auxdata(context, kLiteral, comparison.release(), [](void* kept) {
    std::default_delete<ValueComparison>()(static_cast<ValueComparison*>(kept));
  });
}

// No exception may pass through SQLite; the only one there can be is that memory is used up.
void predicateCompare(sqlite3_context* context, int, sqlite3_value** arguments) noexcept {
  try {
    compareValue(context, arguments);
  } catch (const std::bad_alloc&) {
    sqlite3_result_error_nomem(context);
  }
}

int bindBytes(sqlite3_stmt* statement, int index, const SqlText& text) {
  return sqlite3_bind_text64(statement, index, text.bytes.data(), text.bytes.size(), SQLITE_TRANSIENT,
                             SQLITE_UTF8);
}

int bindOne(sqlite3_stmt* statement, int index, const SqlValue& value) {
  if (const auto* const whole = std::get_if<std::int64_t>(&value)) {
    return sqlite3_bind_int64(statement, index, *whole);
  }
  if (const auto* const real = std::get_if<double>(&value)) {
    return sqlite3_bind_double(statement, index, *real);
  }
  if (const auto* const text = std::get_if<SqlText>(&value)) return bindBytes(statement, index, *text);
  const std::string& bytes = std::get<SqlBlob>(value).bytes;
  return sqlite3_bind_blob64(statement, index, bytes.data(), bytes.size(), SQLITE_TRANSIENT);
}

}  // namespace

Result<void> registerPredicateFunctions(sqlite3* connection) {
  const int flags = SQLITE_UTF8 | SQLITE_DETERMINISTIC | SQLITE_INNOCUOUS;
  const int code = sqlite3_create_function_v2(connection, "predicate_compare", kArgumentCount, flags, nullptr,
                                              predicateCompare, nullptr, nullptr, nullptr);
  return code == SQLITE_OK ? Result<void>() : Result<void>(sqliteError(code));
}

void bindItemRange(sqlite3_stmt* statement, std::int64_t first, std::int64_t last) {
  sqlite3_bind_int64(statement, kFirstItem, first);
  sqlite3_bind_int64(statement, kLastItem, last);
}

Result<void> bindPredicateValues(sqlite3_stmt* statement, const PredicateSql& sql) {
  int index = kFirstValue;
  for (const SqlValue& value : sql.values) {
    const int code = bindOne(statement, index++, value);
    if (code != SQLITE_OK) return sqliteError(code);
  }
  return {};
}

}  // namespace norvex
