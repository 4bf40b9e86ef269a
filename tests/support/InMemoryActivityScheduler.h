// A scheduler that calls nobody until the test tells it to.
#pragma once

#include <string>
#include <utility>
#include <vector>

#include "platform/ActivityScheduler.h"
#include "tests/support/CallJournal.h"

namespace norvex {

class InMemoryActivityScheduler final : public ActivityScheduler {
 public:
  struct Registration {
    std::string identifier;
    ActivityCriteria criteria;
    Handler handler;
  };

  explicit InMemoryActivityScheduler(CallJournal& calls) : calls_(calls) {}

  void registerActivity(const std::string& identifier, ActivityCriteria criteria, Handler handler) override {
    calls_.add("registerActivity " + identifier);
    registrations.push_back({identifier, criteria, std::move(handler)});
  }

  // Calls the handler that was registered last with `activity`, on the calling thread.
  void deliver(Activity& activity) const { registrations.at(registrations.size() - 1).handler(activity); }

  std::vector<Registration> registrations;

 private:
  CallJournal& calls_;
};

}  // namespace norvex
