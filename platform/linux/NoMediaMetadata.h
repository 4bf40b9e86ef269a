// A reader of media files that finds no metadata in any: the formats are not read yet.
//
// With it no file counts as bought from the media store.
#pragma once

#include "platform/MediaMetadataReader.h"

namespace norvex {

class NoMediaMetadata final : public MediaMetadataReader {
 public:
  // Always empty. The file is not opened.
  std::vector<MediaItemKey> itemKeys(const Location& file) override;
};

}  // namespace norvex
