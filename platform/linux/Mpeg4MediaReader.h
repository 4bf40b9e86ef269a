// Reads the keys of the metadata items of MPEG-4 files: of their box headers, a few KiB a file.
//
// Keeps nothing between calls; any number of threads may call it at once.
#pragma once

#include "platform/MediaMetadataReader.h"

namespace norvex {

class Mpeg4MediaReader final : public MediaMetadataReader {
 public:
  // As the role has it. Files other than regular ones are not opened and yield nothing. At most maxMediaItems
  // keys of bounded length, from at most BoxReader::maxBytesRead bytes of the file, however large it is.
  std::vector<MediaItemKey> itemKeys(const Location& file) override;
};

}  // namespace norvex
