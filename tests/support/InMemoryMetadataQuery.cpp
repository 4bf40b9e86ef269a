#include "tests/support/InMemoryMetadataQuery.h"

#include <gtest/gtest.h>

#include <utility>

#include "tests/support/InMemoryMetadataResult.h"

namespace norvex {

void InMemoryMetadataQuery::setPredicate(std::string predicate) {
  index_.calls_.add("setPredicate " + predicate);
  expectNotStarted("setPredicate");
  record_->predicate = std::move(predicate);
}

void InMemoryMetadataQuery::setValueListAttributes(std::vector<std::string> attributes) {
  index_.calls_.add("setValueListAttributes");
  expectNotStarted("setValueListAttributes");
  record_->valueListAttributes = std::move(attributes);
}

void InMemoryMetadataQuery::setSearchScopes(std::vector<Location> scopes) {
  index_.calls_.add("setSearchScopes");
  expectNotStarted("setSearchScopes");
  record_->scopes = std::move(scopes);
}

MetadataQuery::ObserverToken InMemoryMetadataQuery::addFinishObserver(FinishObserver observer) {
  index_.calls_.add("addFinishObserver");
  const std::lock_guard lock(observation_->mutex);
  observation_->observer = std::move(observer);
  return static_cast<ObserverToken>(++record_->observersAdded);
}

void InMemoryMetadataQuery::removeFinishObserver(ObserverToken token) {
  index_.calls_.add("removeFinishObserver");
  EXPECT_EQ(token, static_cast<ObserverToken>(record_->observersAdded)) << "no such observer";
  std::unique_lock lock(observation_->mutex);
  observation_->observer = nullptr;
  ++record_->observersRemoved;
  if (observation_->thread == std::this_thread::get_id()) return;
  observation_->idle.wait(lock, [&] { return !observation_->running; });
}

bool InMemoryMetadataQuery::start() {
  index_.calls_.add("startQuery " + record_->predicate);
  if (index_.whenStarting) index_.whenStarting();
  record_->startingThread = std::this_thread::get_id();
  if (isRefused()) return false;
  record_->started = true;
  startingLoop_ = &index_.loops_.current();
  auto rest = [this, observation = observation_, record = record_, &mainLoop = index_.loops_.main()] {
    if (record->stopped) return;  // `this` may be gone
    gather();
    mainLoop.post([this, observation, record] { notify(*observation, *this, *record); });
  };
  if (index_.deferGathering) {
    index_.deferGathering(*startingLoop_, std::move(rest));
  } else {
    startingLoop_->post(std::move(rest));
  }
  return true;
}

void InMemoryMetadataQuery::notify(Observation& observation, MetadataQuery& query, QueryRecord& record) {
  std::unique_lock lock(observation.mutex);
  const FinishObserver observer = std::exchange(observation.observer, nullptr);
  if (!observer) return;
  record.observingThread = std::this_thread::get_id();
  observation.running = true;
  observation.thread = record.observingThread;
  lock.unlock();
  observer(query);
  lock.lock();
  observation.running = false;
  observation.thread = {};
  observation.idle.notify_all();
}

void InMemoryMetadataQuery::stop() {
  index_.calls_.add("stopQuery");
  record_->stopped = true;
  if (startingLoop_ != nullptr) startingLoop_->post([] {});
}

std::size_t InMemoryMetadataQuery::resultCount() const {
  EXPECT_TRUE(isStopped()) << "the count was read of a query that still gathers";
  const std::size_t read = record_->countReads++;
  return read < index_.countsShown.size() ? index_.countsShown[read] : matches_.size();
}

std::unique_ptr<MetadataResult> InMemoryMetadataQuery::resultAtIndex(std::size_t index) const {
  EXPECT_TRUE(isStopped()) << "a result was read of a query that still gathers";
  const IndexedItem& item = matches_.at(index);
  InMemoryMetadataResult::Attributes attributes;
  if (item.path) attributes.emplace(kMDItemPath, *item.path);
  if (item.hasPurchaseDate) attributes.emplace(kMDItemPurchaseDate, MetadataDate{1});
  return std::make_unique<InMemoryMetadataResult>(index_.calls_, index_.liveness,
                                                  item.path.value_or("(no path)"), std::move(attributes));
}

void InMemoryMetadataQuery::expectNotStarted(const char* operation) const {
  EXPECT_FALSE(record_->started) << operation << " of a query that gathers already";
}

bool InMemoryMetadataQuery::isRefused() const {
  for (const Location& scope : record_->scopes) {
    const auto volume = index_.volumes.find(scope.path());
    if (volume != index_.volumes.end() && volume->second.refused.contains(record_->predicate)) return true;
  }
  return false;
}

void InMemoryMetadataQuery::gather() {
  for (const Location& scope : record_->scopes) {
    const auto volume = index_.volumes.find(scope.path());
    if (volume == index_.volumes.end()) continue;
    const auto found = volume->second.matches.find(record_->predicate);
    if (found == volume->second.matches.end()) continue;
    matches_.insert(matches_.end(), found->second.begin(), found->second.end());
  }
}

}  // namespace norvex
