// A metadata index whose volumes, items and matches a test writes down.
//
// Volumes are set up before the code under test runs. Queries may be started on one thread and read on the
// main thread, as the role says.
#pragma once

#include <atomic>
#include <chrono>
#include <cstdint>
#include <deque>
#include <functional>
#include <map>
#include <memory>
#include <mutex>
#include <optional>
#include <set>
#include <string>
#include <thread>
#include <vector>

#include "platform/EventLoop.h"
#include "platform/MetadataIndex.h"
#include "tests/support/CallJournal.h"

namespace norvex {

// One match of a query.
struct IndexedItem {
  std::optional<std::string> path;
  bool hasPurchaseDate = false;
};

struct IndexedVolume {
  bool hasItem = true;
  bool hasHealthCheck = true;
  std::optional<std::vector<std::int64_t>> accumulatedSizes = std::vector<std::int64_t>(18, 0);
  // By predicate. A predicate that is not here matches nothing.
  std::map<std::string, std::vector<IndexedItem>> matches;
  // Predicates with which a query does not start.
  std::set<std::string> refused;
};

// What became of one query.
struct QueryRecord {
  std::string predicate;
  std::vector<std::string> valueListAttributes;
  std::vector<Location> scopes;
  bool started = false;
  int observersAdded = 0;
  int observersRemoved = 0;
  std::atomic<bool> stopped{false};
  std::atomic<bool> alive{true};
  std::thread::id startingThread;
  std::thread::id observingThread;
  std::atomic<std::size_t> countReads{0};
};

class InMemoryMetadataIndex final : public MetadataIndex {
 public:
  // `loops` outlives every query.
  InMemoryMetadataIndex(CallJournal& calls, EventLoops& loops) : calls_(calls), loops_(loops) {}

  std::unique_ptr<MetadataQuery> createQuery() override;

  // Has an item for the root of each of `volumes` that has one, and for nothing else.
  std::unique_ptr<MetadataResult> itemAtPath(const std::string& path) override;

  // By the path of the root. A volume that is not here has no item and matches nothing.
  std::map<std::string, IndexedVolume> volumes;
  // In the order in which they were made.
  std::deque<std::shared_ptr<QueryRecord>> queries;
  // The counts that each query tells before it tells the true one, one a question.
  std::vector<std::size_t> countsShown;
  // Puts off the end of the gathering, in a way that the test chooses: it is given the rest of the work.
  std::function<void(EventLoop&, EventLoop::Input)> deferGathering;
  // Called when a query is started.
  std::function<void()> whenStarting;

  // How many results and items there are that nobody has released yet, and how many there were at most.
  struct Liveness {
    std::atomic<int> now{0};
    std::atomic<int> most{0};
  };
  std::shared_ptr<Liveness> liveness = std::make_shared<Liveness>();

 private:
  friend class InMemoryMetadataQuery;

  CallJournal& calls_;
  EventLoops& loops_;
};

}  // namespace norvex
