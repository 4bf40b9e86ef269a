// The tasks of a crawl and the threads that run them: the last one given is run first, because it is the one
// whose turn is next. The writer's thread lends a hand instead of waiting.
//
// Used by one crawl, on its writer's thread.
#pragma once

#include <atomic>
#include <condition_variable>
#include <cstddef>
#include <memory>
#include <mutex>
#include <thread>
#include <vector>

#include "index/CrawlTask.h"

namespace norvex {

class CrawlWorkers {
 public:
  // `helpers`: how many threads besides the writer's. Both references outlive the workers.
  CrawlWorkers(const CrawlVolume& volume, const CrawlRules& rules, std::size_t helpers);

  // Drops the tasks that nobody has begun, and waits for the others.
  ~CrawlWorkers();
  CrawlWorkers(const CrawlWorkers&) = delete;
  CrawlWorkers& operator=(const CrawlWorkers&) = delete;

  // Gives tasks of which the first is to be run first.
  void give(std::vector<std::shared_ptr<CrawlTask>> tasks);

  // Returns when the task, which was given before, is done, and takes its memory off what is held; until then
  // this thread runs what waits. False when `cancelled` came first.
  bool finish(const CrawlTask& task, const std::atomic<bool>& cancelled);

  // How many tasks nobody has begun; and about the memory of those that are done and not finished, in bytes.
  std::size_t waiting() const { return waitingCount_.load(std::memory_order_relaxed); }
  std::size_t heldBytes() const { return heldBytes_.load(std::memory_order_relaxed); }

 private:
  void work();
  void runNext(CrawlFolderReader& reader, std::unique_lock<std::mutex>& lock);

  const CrawlVolume& volume_;
  const CrawlRules& rules_;
  CrawlFolderReader reader_;  // the writer's own
  std::mutex mutex_;
  std::condition_variable given_, done_;
  std::vector<std::shared_ptr<CrawlTask>> waiting_;
  std::size_t idle_ = 0;  // helpers that wait for tasks
  bool isClosing_ = false;
  std::atomic<std::size_t> waitingCount_{0};
  std::atomic<std::size_t> heldBytes_{0};
  std::atomic<const CrawlTask*> wanted_{nullptr};
  std::vector<std::thread> threads_;
};

}  // namespace norvex
