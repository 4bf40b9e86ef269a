#include "index/FinishObservers.h"

#include <utility>

namespace norvex {

MetadataQuery::ObserverToken FinishObservers::add(MetadataQuery::FinishObserver observer) {
  const std::lock_guard lock(mutex_);
  observers_.emplace(++lastToken_, std::move(observer));
  return lastToken_;
}

void FinishObservers::remove(MetadataQuery::ObserverToken token) {
  std::unique_lock lock(mutex_);
  observers_.erase(token);
  const bool calledByItself = runningToken_ == token && runningThread_ == std::this_thread::get_id();
  if (calledByItself) return;
  idle_.wait(lock, [&] { return runningToken_ != token; });
}

void FinishObservers::notify(MetadataQuery& query) {
  std::unique_lock lock(mutex_);
  while (!observers_.empty()) {
    // Taken out before the call: each observer is told once, and may remove itself or others meanwhile.
    auto next = observers_.extract(observers_.begin());
    runningToken_ = next.key();
    runningThread_ = std::this_thread::get_id();
    lock.unlock();
    next.mapped()(query);
    lock.lock();
    runningToken_ = 0;
    idle_.notify_all();
  }
}

}  // namespace norvex
