#include "platform/linux/NoMediaMetadata.h"

namespace norvex {

std::vector<MediaItemKey> NoMediaMetadata::itemKeys(const Location&) {
  return {};
}

}  // namespace norvex
