#include "platform/linux/UserManagerJobRegistry.h"

#include "platform/linux/TimedJob.h"

namespace norvex {

Result<void> UserManagerJobRegistry::disableJob(JobDomain, const std::string& label) {
  Result<UserManager> manager = UserManager::connect(environment_, callLimit_);
  if (!manager) return manager.error();
  return TimedJob(manager.value(), label).disable();
}

}  // namespace norvex
