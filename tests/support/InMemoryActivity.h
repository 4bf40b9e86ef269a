// An activity in a given state, which keeps the states that its handler has set.
#pragma once

#include <string>
#include <vector>

#include "platform/ActivityScheduler.h"
#include "tests/support/CallJournal.h"

namespace norvex {

class InMemoryActivity final : public Activity {
 public:
  InMemoryActivity(CallJournal& calls, ActivityState state) : calls_(calls), state_(state) {}

  ActivityState state() const override { return state_; }

  void setState(ActivityState state) override {
    calls_.add("setState " + std::to_string(static_cast<int>(state)));
    state_ = state;
    statesSet.push_back(state);
  }

  std::vector<ActivityState> statesSet;

 private:
  CallJournal& calls_;
  ActivityState state_;
};

}  // namespace norvex
