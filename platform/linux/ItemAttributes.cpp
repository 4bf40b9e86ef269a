#include "platform/linux/ItemAttributes.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <cerrno>

namespace norvex {
namespace {

ItemAttributes ask(int folder, const char* path, int flags) {
  // No more than is needed: a network file system may have to ask its server for the rest.
  constexpr unsigned kWanted = STATX_TYPE | STATX_SIZE | STATX_INO;
  struct statx answer;
  ItemAttributes attributes;
  if (::statx(folder, path, flags, kWanted, &answer) != 0) {
    attributes.error = errno;
    return attributes;
  }
  attributes.isFolder = S_ISDIR(answer.stx_mode);
  attributes.isRegularFile = S_ISREG(answer.stx_mode);
  attributes.size = answer.stx_size;
  attributes.identity.device = std::uint64_t{answer.stx_dev_major} << 32U | answer.stx_dev_minor;
  attributes.identity.inode = answer.stx_ino;
  return attributes;
}

}  // namespace

ItemAttributes attributesOf(int folder, const char* path) {
  return ask(folder, path, AT_SYMLINK_NOFOLLOW | AT_NO_AUTOMOUNT);
}

ItemAttributes attributesOf(int descriptor) {
  return ask(descriptor, "", AT_EMPTY_PATH);
}

}  // namespace norvex
