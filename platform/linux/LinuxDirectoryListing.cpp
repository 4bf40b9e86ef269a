#include "platform/linux/LinuxDirectoryListing.h"

#include <fcntl.h>

#include "platform/FileDescriptor.h"
#include "platform/linux/CallablePath.h"
#include "platform/linux/FolderNames.h"

namespace norvex {

std::optional<std::vector<std::string>> LinuxDirectoryListing::names(const std::string& folderPath) {
  const CallablePath path(folderPath);
  if (path.error() != 0) return std::nullopt;
  const FileDescriptor folder(::openat(path.folder(), path.path(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
  FolderNames listed;
  if (!folder || listed.read(folder.number()) != 0) return std::nullopt;
  std::vector<std::string> names;
  names.reserve(listed.size());
  for (std::size_t position = 0; position < listed.size(); ++position) names.emplace_back(listed[position]);
  return names;
}

}  // namespace norvex
