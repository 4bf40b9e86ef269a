#include "platform/linux/Mpeg4MediaReader.h"

#include "platform/linux/MediaItemList.h"

namespace norvex {

std::vector<MediaItemKey> Mpeg4MediaReader::itemKeys(const Location& file) {
  auto opened = folder_.openFile(file.path());
  if (!opened) return {};
  return mediaItemKeys(*opened);
}

}  // namespace norvex
