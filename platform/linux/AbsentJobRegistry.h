// The register of background jobs of a system on which the agent cannot speak to a service manager.
//
// Stands in until there is a binding to one. It switches nothing off and says so.
#pragma once

#include "platform/JobRegistry.h"

namespace norvex {

class AbsentJobRegistry final : public JobRegistry {
 public:
  // Always fails, with ENOSYS. The job is as it was.
  Result<void> disableJob(JobDomain domain, const std::string& label) override;
};

}  // namespace norvex
