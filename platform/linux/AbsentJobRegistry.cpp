#include "platform/linux/AbsentJobRegistry.h"

#include <cerrno>

namespace norvex {

Result<void> AbsentJobRegistry::disableJob(JobDomain, const std::string&) {
  return systemError(ENOSYS);
}

}  // namespace norvex
