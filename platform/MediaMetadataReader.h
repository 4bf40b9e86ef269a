// The metadata items inside a media file.
//
// Called on the main thread while the run waits, and on the thread of the run.
#pragma once

#include <cstdint>
#include <string>
#include <variant>
#include <vector>

#include "platform/Location.h"

namespace norvex {

// The key of one item: a four-character code (the first character in the most significant byte) or a text.
using MediaItemKey = std::variant<std::uint32_t, std::string>;

class MediaMetadataReader {
 public:
  virtual ~MediaMetadataReader() = default;

  // The keys of the file's metadata item list, in the file's order. Empty when the file cannot be read, is no
  // media file or carries no such list.
  virtual std::vector<MediaItemKey> itemKeys(const Location& file) = 0;
};

}  // namespace norvex
