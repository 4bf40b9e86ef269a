// Memory pressure at the test's command.
//
// A subscription may outlive its source and the test: the watchdog keeps one for the life of the process.
#pragma once

#include <functional>
#include <memory>
#include <vector>

#include "platform/MemoryPressureSource.h"
#include "tests/support/CallJournal.h"

namespace norvex {

class InMemoryMemoryPressureSource final : public MemoryPressureSource {
 public:
  struct Subscription {
    MemoryPressureLevels levels;
    std::function<void()> handler;
    bool resumed = false;
    bool ended = false;
    bool handlerSetLate = false;  // after resume()
  };

  explicit InMemoryMemoryPressureSource(CallJournal& calls) : calls_(calls) {}

  std::unique_ptr<MemoryPressureEvents> create(MemoryPressureLevels levels) override {
    calls_.add("createMemoryPressure");
    subscriptions.push_back(std::make_shared<Subscription>());
    subscriptions.back()->levels = levels;
    return std::make_unique<Events>(subscriptions.back());
  }

  // Calls the handler of every subscription that delivers, on the calling thread.
  void fire() const {
    for (const auto& subscription : subscriptions) {
      if (subscription->resumed && !subscription->ended) subscription->handler();
    }
  }

  std::vector<std::shared_ptr<Subscription>> subscriptions;

 private:
  class Events final : public MemoryPressureEvents {
   public:
    explicit Events(std::shared_ptr<Subscription> subscription) : subscription_(std::move(subscription)) {}
    ~Events() override { subscription_->ended = true; }
    void setHandler(std::function<void()> handler) override {
      subscription_->handlerSetLate = subscription_->resumed;
      subscription_->handler = std::move(handler);
    }
    void resume() override { subscription_->resumed = true; }

   private:
    std::shared_ptr<Subscription> subscription_;
  };

  CallJournal& calls_;
};

}  // namespace norvex
