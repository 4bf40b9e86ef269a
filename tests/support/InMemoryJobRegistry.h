// A register of jobs that knows which ones have been switched off, and can refuse.
//
// Any thread may call.
#pragma once

#include <mutex>
#include <optional>
#include <set>
#include <string>

#include "platform/JobRegistry.h"
#include "tests/support/CallJournal.h"

namespace norvex {

class InMemoryJobRegistry final : public JobRegistry {
 public:
  explicit InMemoryJobRegistry(CallJournal& calls) : calls_(calls) {}

  Result<void> disableJob(JobDomain, const std::string& label) override {
    calls_.add("disableJob " + label);
    const std::lock_guard lock(mutex_);
    if (failure) return *failure;
    disabledJobs.insert(label);
    return {};
  }

  std::set<std::string> disabledJobs;
  // Present: every request fails with it.
  std::optional<Error> failure;

 private:
  CallJournal& calls_;
  std::mutex mutex_;
};

}  // namespace norvex
