// How the bytes of an attribute's value become what the store keeps of them.
//
// Used by the store's writer, on its thread. Pure but for the statement that is given.
#pragma once

#include <sqlite3.h>

#include <string_view>

namespace norvex {

// Binds a number when `value` is one, else text, else - where the bytes are not UTF-8 - the bytes. `value`
// stays valid until the statement has been run. One line feed or NUL at the end does not count.
void bindStoreValue(sqlite3_stmt* statement, int index, std::string_view value);

}  // namespace norvex
