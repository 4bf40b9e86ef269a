#include "platform/linux/Mpeg4MediaReader.h"

#include <fcntl.h>

#include <string_view>

#include "platform/linux/CallablePath.h"
#include "platform/linux/MediaItemList.h"

namespace norvex {
namespace {

FileDescriptor openFolder(const std::string& path) {
  const CallablePath callable(path.empty() ? "." : path);
  if (callable.error() != 0) return {};
  return FileDescriptor(::openat(callable.folder(), callable.path(), O_PATH | O_DIRECTORY | O_CLOEXEC));
}

}  // namespace

std::vector<MediaItemKey> Mpeg4MediaReader::itemKeys(const Location& file) {
  auto opened = open(file.path());
  if (!opened) return {};
  return mediaItemKeys(*opened);
}

std::optional<RegularFile> Mpeg4MediaReader::open(const std::string& path) {
  const std::size_t nameBegin = path.rfind('/') + 1;  // 0 without a separator
  const std::string_view folderPath = std::string_view(path).substr(0, nameBegin);
  const char* name = path.c_str() + nameBegin;
  if (folder_ && folderPath == folderPath_) {
    if (auto file = RegularFile::openAt(folder_.number(), name)) return file;
  }
  // Another folder; or the path leads to another one by now.
  folderPath_ = folderPath;
  folder_ = openFolder(folderPath_);
  if (!folder_) return std::nullopt;
  return RegularFile::openAt(folder_.number(), name);
}

}  // namespace norvex
