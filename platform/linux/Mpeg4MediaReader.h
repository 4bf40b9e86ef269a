// Reads the keys of the metadata items of MPEG-4 files: of their box headers, a few KiB a file.
//
// Between calls it keeps the folder of the last file open. Called by one thread at a time.
#pragma once

#include "platform/MediaMetadataReader.h"
#include "platform/linux/MediaFolder.h"

namespace norvex {

class Mpeg4MediaReader final : public MediaMetadataReader {
 public:
  // As the role has it. Files other than regular ones are not opened and yield nothing. At most maxMediaItems
  // keys of bounded length, from at most BoxReader::maxBytesRead bytes of the file, however large it is.
  std::vector<MediaItemKey> itemKeys(const Location& file) override;

 private:
  MediaFolder folder_;
};

}  // namespace norvex
