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
  bool isAwaited = false;
  {
    const std::lock_guard lock(mutex_);
    waiting_.insert(waiting_.end(), std::make_move_iterator(tasks.rbegin()),
                    std::make_move_iterator(tasks.rend()));
    waitingCount_.store(waiting_.size(), std::memory_order_relaxed);
    isAwaited = idle_ > 0;
  }
  if (isAwaited) given_.notify_all();
}

bool CrawlWorkers::finish(const CrawlTask& task, const std::atomic<bool>& cancelled) {
  const auto isDone = [&task] { return task.isDone_.load(); };
  if (!isDone()) {
    wanted_.store(&task);
    std::unique_lock lock(mutex_);
    while (!isDone() && !cancelled.load(std::memory_order_relaxed)) {
      if (waiting_.empty()) {
        done_.wait_for(lock, kLookForCancel);
      } else {
        runNext(reader_, lock);
      }
    }
    wanted_.store(nullptr);
  }
  if (isDone()) heldBytes_.fetch_sub(task.batch.bytes(), std::memory_order_relaxed);
  return isDone() && !cancelled.load(std::memory_order_relaxed);
}

// The lock is taken once a task: what it leaves behind is told by atomics, of which `isDone_` publishes the
// task.
void CrawlWorkers::runNext(CrawlFolderReader& reader, std::unique_lock<std::mutex>& lock) {
  const std::shared_ptr<CrawlTask> task = std::move(waiting_.back());
  waiting_.pop_back();
  waitingCount_.store(waiting_.size(), std::memory_order_relaxed);
  lock.unlock();
  task->run(reader);
  heldBytes_.fetch_add(task->bytes(), std::memory_order_relaxed);
  task->setDone();
  const bool isWanted = wanted_.load() == task.get();
  lock.lock();
  if (isWanted) done_.notify_one();
}

void CrawlWorkers::work() {
  CrawlFolderReader reader(volume_, rules_);
  std::unique_lock lock(mutex_);
  while (true) {
    ++idle_;
    given_.wait(lock, [this] { return isClosing_ || !waiting_.empty(); });
    --idle_;
    if (isClosing_) return;
    runNext(reader, lock);
  }
}

}  // namespace norvex
