// One query of the in-memory metadata index. Made by that index alone.
//
// Holds its user to the role's contract: reading results before the stop, beyond the count, or setting
// something up after the start fails the test.
#pragma once

#include <condition_variable>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "tests/support/InMemoryMetadataIndex.h"

namespace norvex {

class InMemoryMetadataQuery final : public MetadataQuery {
 public:
  InMemoryMetadataQuery(InMemoryMetadataIndex& index, std::shared_ptr<QueryRecord> record)
      : index_(index), record_(std::move(record)) {}
  ~InMemoryMetadataQuery() override { record_->alive = false; }

  void setPredicate(std::string predicate) override;
  void setValueListAttributes(std::vector<std::string> attributes) override;
  void setSearchScopes(std::vector<Location> scopes) override;
  ObserverToken addFinishObserver(FinishObserver observer) override;
  void removeFinishObserver(ObserverToken token) override;
  bool start() override;
  void stop() override;
  bool isStopped() const override { return record_->stopped; }
  std::size_t resultCount() const override;
  std::unique_ptr<MetadataResult> resultAtIndex(std::size_t index) const override;

 private:
  // The observer, shared with the inputs that are under way: they may run after the query is gone.
  struct Observation {
    std::mutex mutex;
    std::condition_variable idle;
    FinishObserver observer;
    bool running = false;
    std::thread::id thread;
  };
  static void notify(Observation& observation, MetadataQuery& query, QueryRecord& record);

  void expectNotStarted(const char* operation) const;
  bool isRefused() const;
  void gather();

  InMemoryMetadataIndex& index_;
  std::shared_ptr<QueryRecord> record_;
  std::shared_ptr<Observation> observation_ = std::make_shared<Observation>();
  EventLoop* startingLoop_ = nullptr;
  std::vector<IndexedItem> matches_;
};

}  // namespace norvex
