#include "platform/linux/MediaFolder.h"

#include <dirent.h>
#include <fcntl.h>
#include <sys/types.h>

#include <cstring>

#include "platform/linux/CallablePath.h"

namespace norvex {
namespace {

// No entry takes more: its name has at most 255 bytes.
constexpr std::size_t kLongestEntry = sizeof(dirent64);

}  // namespace

std::optional<RegularFile> MediaFolder::openFile(const std::string& path) {
  const std::size_t nameBegin = path.rfind('/') + 1;  // 0 without a separator
  const std::string_view folderPath = std::string_view(path).substr(0, nameBegin);
  const char* name = path.c_str() + nameBegin;
  if (folder_ && folderPath == path_) {
    if (auto file = openName(name)) return file;
  }
  // Another folder; or the path leads to another one by now.
  openFolder(folderPath);
  if (!folder_) return std::nullopt;
  return openName(name);
}

void MediaFolder::openFolder(std::string_view path) {
  path_ = path;
  folder_ = FileDescriptor();
  listingEnd_ = 0;
  const CallablePath callable(path.empty() ? "." : path);
  if (callable.error() != 0) return;
  constexpr int kFlags = O_DIRECTORY | O_CLOEXEC;
  folder_ = FileDescriptor(::openat(callable.folder(), callable.path(), kFlags | O_RDONLY | O_NOATIME));
  if (folder_) return listNames();
  // One that may be passed through but not listed, or another user's, whose time of last access would change.
  folder_ = FileDescriptor(::openat(callable.folder(), callable.path(), kFlags | O_PATH));
}

// A folder that does not fit is no album, and is not worth being looked through for each of its files.
void MediaFolder::listNames() {
  const ssize_t length = ::getdents64(folder_.number(), listing_.data(), listing_.size());
  if (length > 0 && static_cast<std::size_t>(length) + kLongestEntry <= listing_.size())
    listingEnd_ = static_cast<std::size_t>(length);
}

std::optional<RegularFile> MediaFolder::openName(const char* name) {
  if (takeMarkOfRegularFile(name)) return RegularFile::openKnownAt(folder_.number(), name);
  return RegularFile::openAt(folder_.number(), name);
}

bool MediaFolder::takeMarkOfRegularFile(std::string_view name) {
  for (std::size_t at = 0; at < listingEnd_;) {
    char* entry = listing_.data() + at;
    unsigned short length = 0;
    std::memcpy(&length, entry + offsetof(dirent64, d_reclen), sizeof length);
    if (name == entry + offsetof(dirent64, d_name)) {
      char& type = entry[offsetof(dirent64, d_type)];
      const bool isRegular = type == DT_REG;
      type = DT_UNKNOWN;
      return isRegular;
    }
    at += length;
  }
  return false;
}

}  // namespace norvex
