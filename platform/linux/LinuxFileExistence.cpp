#include "platform/linux/LinuxFileExistence.h"

#include <unistd.h>

#include "platform/linux/CallablePath.h"

namespace norvex {

bool LinuxFileExistence::exists(const std::string& path) {
  const CallablePath callable(path);
  return callable.error() == 0 && ::faccessat(callable.folder(), callable.path(), F_OK, 0) == 0;
}

}  // namespace norvex
