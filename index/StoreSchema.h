// What a store holds, as SQL: the tables, their index, and the names of the facts about a volume.
//
//   items            every file and folder of the volume. `id` counts in the order of the crawl, so a
//   parent's id is
//                    below its children's, and the children of one folder follow each other; the volume's
//                    root is 1. `size` in bytes, NULL for folders; `mtime` in nanoseconds since 1970.
//   folders          where the children of a folder are; a row for every folder that the crawl came to.
//   types, type_tree the content types that occur, and what each conforms to, itself included.
//   attributes       what some items carry besides, by the id of the attribute's name.
//   facts            figures about the whole volume.
//
// Used by the store's writer and reader.
#pragma once

#include <array>
#include <cstdint>
#include <string_view>

namespace norvex {

// Rises when an older program could no longer read what a newer one writes. Kept as the file's user_version.
inline constexpr std::int64_t kStoreSchemaVersion = 1;

struct StoreSchemaObject {
  std::string_view kind;  // as sqlite_schema calls it
  std::string_view name;
  const char* sql;
};

// In the order in which they are made. Indexes are made last, from what is there.
inline constexpr std::array<StoreSchemaObject, 8> kStoreSchema{{
    {"table", "facts", "CREATE TABLE facts(name TEXT PRIMARY KEY, value) WITHOUT ROWID"},
    {"table", "items",
     "CREATE TABLE items(id INTEGER PRIMARY KEY, parent INTEGER, name BLOB, type INTEGER, size INTEGER, "
     "mtime INTEGER)"},
    {"table", "folders",
     "CREATE TABLE folders(item INTEGER PRIMARY KEY, first_child INTEGER, child_count INTEGER, state "
     "INTEGER)"},
    {"table", "types", "CREATE TABLE types(id INTEGER PRIMARY KEY, identifier TEXT, kind TEXT)"},
    {"table", "type_tree",
     "CREATE TABLE type_tree(ancestor TEXT, type INTEGER, PRIMARY KEY(ancestor, type)) WITHOUT ROWID"},
    {"table", "attribute_names", "CREATE TABLE attribute_names(id INTEGER PRIMARY KEY, name TEXT UNIQUE)"},
    {"table", "attributes",
     "CREATE TABLE attributes(name INTEGER, item INTEGER, value, PRIMARY KEY(name, item)) WITHOUT ROWID"},
    {"index", "items_by_type", "CREATE INDEX items_by_type ON items(type)"},
}};

inline constexpr std::int64_t kRootItem = 1;

// `folders.state`: what the crawl found when it came to the folder.
enum class StoreFolderState : std::int64_t {
  sorted = 0,      // its children stand in byte order of their names
  unsorted = 1,    // its children stand in no order: too many to be sorted in memory
  border = 2,      // another volume, or a snapshot, begins here
  unreadable = 3,  // could not be opened, or not be read to its end
};

// Names of facts.
inline constexpr std::string_view kFactRoot = "root";               // the volume's root path
inline constexpr std::string_view kFactFileSystem = "file_system";  // which file system it was
inline constexpr std::string_view kFactFiles = "files";             // everything that is no folder
inline constexpr std::string_view kFactFolders = "folders";         // without the volume's root
inline constexpr std::string_view kFactUnreadable = "unreadable";   // items that could not be read
inline constexpr std::string_view kFactAccumulatedSizes = "accumulated_sizes";  // numbers with blanks between
inline constexpr std::string_view kFactHealthCheck = "health_check";            // seconds since 1970

}  // namespace norvex
