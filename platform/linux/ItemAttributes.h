// What one statx call tells about an item.
//
// Used on any thread.
#pragma once

#include <cstdint>

namespace norvex {

// Which item it is, on this machine and at this moment.
struct ItemIdentity {
  std::uint64_t device = 0;
  std::uint64_t inode = 0;
  friend bool operator==(const ItemIdentity&, const ItemIdentity&) = default;
};

struct ItemAttributes {
  // 0, or the errno value of the call; then nothing below means anything.
  int error = 0;
  bool isFolder = false;
  bool isRegularFile = false;
  std::uint64_t size = 0;  // bytes of the main stream; a link's own size
  ItemIdentity identity;
};

// The attributes of the item at `path`, which is relative to `folder` as in the ...at() calls. A link is not
// followed, and nothing is mounted on the way.
ItemAttributes attributesOf(int folder, const char* path);

// The attributes of an open file.
ItemAttributes attributesOf(int descriptor);

}  // namespace norvex
