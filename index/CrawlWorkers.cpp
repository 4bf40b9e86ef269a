#include "index/CrawlWorkers.h"

#include <chrono>
#include <iterator>
#include <utility>

namespace norvex {
namespace {

// How long a crawl that has been cancelled may wait for a file system that does not answer before it notices.
constexpr std::chrono::milliseconds kLookForCancel{100};

}  // namespace

CrawlWorkers::CrawlWorkers(const CrawlVolume& volume, const CrawlRules& rules, std::size_t helpers)
    : volume_(volume), rules_(rules), reader_(volume, rules) {
  for (std::size_t index = 0; index < helpers; ++index) threads_.emplace_back([this] { work(); });
}

CrawlWorkers::~CrawlWorkers() {
  {
    const std::lock_guard lock(mutex_);
    isClosing_ = true;
    waiting_.clear();
  }
  given_.notify_all();
  for (std::thread& thread : threads_) thread.join();
}

void CrawlWorkers::give(std::vector<std::shared_ptr<CrawlTask>> tasks) {
  if (tasks.empty()) return;
  {
    const std::lock_guard lock(mutex_);
    waiting_.insert(waiting_.end(), std::make_move_iterator(tasks.rbegin()),
                    std::make_move_iterator(tasks.rend()));
  }
  given_.notify_all();
}

bool CrawlWorkers::finish(const CrawlTask& task, const std::atomic<bool>& cancelled) {
  std::unique_lock lock(mutex_);
  wanted_ = &task;
  while (!task.isDone_ && !cancelled.load(std::memory_order_relaxed)) {
    if (waiting_.empty()) {
      done_.wait_for(lock, kLookForCancel);
    } else {
      runNext(reader_, lock);
    }
  }
  wanted_ = nullptr;
  if (task.isDone_) heldBytes_ -= task.batch.bytes();
  return task.isDone_;
}

CrawlWorkers::Load CrawlWorkers::load() const {
  const std::lock_guard lock(mutex_);
  return {waiting_.size(), heldBytes_};
}

void CrawlWorkers::runNext(CrawlFolderReader& reader, std::unique_lock<std::mutex>& lock) {
  const std::shared_ptr<CrawlTask> task = std::move(waiting_.back());
  waiting_.pop_back();
  lock.unlock();
  task->run(reader);
  const std::size_t bytes = task->batch.bytes();
  lock.lock();
  heldBytes_ += bytes;
  task->isDone_ = true;
  if (wanted_ == task.get()) done_.notify_one();
}

void CrawlWorkers::work() {
  CrawlFolderReader reader(volume_, rules_);
  std::unique_lock lock(mutex_);
  while (true) {
    given_.wait(lock, [this] { return isClosing_ || !waiting_.empty(); });
    if (isClosing_) return;
    runNext(reader, lock);
  }
}

}  // namespace norvex
