// The register of background jobs that the user's service manager keeps.
#pragma once

#include "platform/JobRegistry.h"
#include "platform/linux/Environment.h"
#include "platform/linux/UserManager.h"

namespace norvex {

class UserManagerJobRegistry final : public JobRegistry {
 public:
  // `environment` is that of the process: it names the bus.
  explicit UserManagerJobRegistry(Environment environment,
                                  std::chrono::milliseconds callLimit = UserManager::kCallLimit)
      : environment_(std::move(environment)), callLimit_(callLimit) {}

  // Masks and stops whatever starts `label`.service, as TimedJob::disable() does, on a connection of its own:
  // the run and the watchdog may ask at the same time. A manager that does not answer is waited for twice the
  // call limit at most, once on the way to the bus and once for the first answer.
  Result<void> disableJob(JobDomain domain, const std::string& label) override;

 private:
  Environment environment_;
  std::chrono::milliseconds callLimit_;
};

}  // namespace norvex
