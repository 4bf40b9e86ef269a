// Reads the keys of the metadata items of MPEG-4 files: of their box headers, a few KiB a file.
//
// Between calls it keeps the folder of the last file open: the next one mostly lies beside it, as the songs
// of an album do, and is then found by its name alone. Called by one thread at a time.
#pragma once

#include <optional>
#include <string>

#include "platform/FileDescriptor.h"
#include "platform/MediaMetadataReader.h"
#include "platform/linux/RegularFile.h"

namespace norvex {

class Mpeg4MediaReader final : public MediaMetadataReader {
 public:
  // As the role has it. Files other than regular ones are not opened and yield nothing. At most maxMediaItems
  // keys of bounded length, from at most BoxReader::maxBytesRead bytes of the file, however large it is.
  std::vector<MediaItemKey> itemKeys(const Location& file) override;

 private:
  std::optional<RegularFile> open(const std::string& path);

  std::string folderPath_;  // with its last separator
  FileDescriptor folder_;
};

}  // namespace norvex
