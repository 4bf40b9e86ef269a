#include "platform/linux/VolumeStatistics.h"

#include <fcntl.h>

#include <cerrno>

#include "platform/FileDescriptor.h"
#include "platform/linux/CallablePath.h"

namespace norvex {

Result<struct statvfs> volumeStatistics(const std::string& path) {
  const CallablePath callable(path);
  if (callable.error() != 0) return systemError(callable.error());
  const FileDescriptor handle(::openat(callable.folder(), callable.path(), O_PATH | O_CLOEXEC));
  struct statvfs statistics;
  if (!handle || ::fstatvfs(handle.number(), &statistics) != 0) return systemError(errno);
  return statistics;
}

}  // namespace norvex
