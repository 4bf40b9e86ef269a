// Which position of the accumulated sizes a file's bytes are counted at.
//
// Used by the crawler and the content types, on any thread. Pure. Every regular file has exactly one
// position, so the sum over the positions is the sum over the files.
#pragma once

#include <string_view>

#include "index/ContentTypes.h"
#include "index/StoragePosition.h"

namespace norvex {

// What a file's place and mode say about it, besides its name.
struct ItemContext {
  // Anywhere below an application bundle or an application's deployment folder.
  bool insideApplication = false;
  // A direct child of `cur` or `new` of a Maildir.
  bool inMaildir = false;
  // Any of the three execute bits.
  bool executable = false;
};

// The position of a file by its type alone: the first row of the table that names the type. `typeName` is a
// MIME type or one of the project's own.
StoragePosition positionOfType(std::string_view typeName);

// The position of a regular file. Applications come first, then mail, then what the type says.
StoragePosition positionOf(const ContentType& type, const ItemContext& context);

}  // namespace norvex
