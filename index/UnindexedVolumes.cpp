#include "index/UnindexedVolumes.h"

#include <atomic>

#include "index/FinishObservers.h"

namespace norvex {
namespace {

// Gathers nothing, but in the order in which every query works: the gathering is an input of the loop it was
// started on, the end of the gathering an input of the main loop.
class EmptyQuery final : public MetadataQuery {
 public:
  explicit EmptyQuery(EventLoops& loops) : loops_(loops) {}

  void setPredicate(std::string) override {}
  void setValueListAttributes(std::vector<std::string>) override {}
  void setSearchScopes(std::vector<Location>) override {}

  ObserverToken addFinishObserver(FinishObserver observer) override {
    return observers_->add(std::move(observer));
  }
  void removeFinishObserver(ObserverToken token) override { observers_->remove(token); }

  bool start() override {
    startingLoop_ = &loops_.current();
    // The inputs share the observers, not the query: whoever waits for the query removes his observer before
    // he drops it, and an input that runs later finds nobody to tell.
    startingLoop_->post([this, observers = observers_, &mainLoop = loops_.main()] {
      mainLoop.post([this, observers] { observers->notify(*this); });
    });
    return true;
  }

  void stop() override {
    stopped_.store(true, std::memory_order_release);
    startingLoop_->post([] {});  // ends the pass that waits for the gathering
  }

  bool isStopped() const override { return stopped_.load(std::memory_order_acquire); }
  std::size_t resultCount() const override { return 0; }
  std::unique_ptr<MetadataResult> resultAtIndex(std::size_t) const override { return nullptr; }

 private:
  EventLoops& loops_;
  EventLoop* startingLoop_ = nullptr;
  std::shared_ptr<FinishObservers> observers_ = std::make_shared<FinishObservers>();
  std::atomic<bool> stopped_{false};
};

}  // namespace

std::unique_ptr<MetadataQuery> UnindexedVolumes::createQuery() {
  return std::make_unique<EmptyQuery>(loops_);
}

std::unique_ptr<MetadataResult> UnindexedVolumes::itemAtPath(const std::string&) {
  return nullptr;
}

}  // namespace norvex
