#include "index/StoredQuery.h"

#include <atomic>
#include <utility>

#include "index/FinishObservers.h"
#include "index/PredicateParser.h"
#include "index/PredicateSql.h"
#include "index/StoreSearch.h"

namespace norvex {
namespace {

// The matches in one store: what is still to be searched, and what has been found.
struct StoreMatches {
  StoreReader* store;
  StoreSearch search;
  std::vector<std::int64_t> items;
};

// What a query and its pending inputs share, so that an input may come late.
struct Gathering {
  explicit Gathering(VolumeStores& itsStores) : stores(itsStores) {}

  VolumeStores& stores;
  std::vector<StoreMatches> matches;
  FinishObservers observers;
  std::atomic<bool> stopped{false};
};

class StoredQuery final : public MetadataQuery {
 public:
  StoredQuery(VolumeStores& stores, EventLoops& loops)
      : loops_(loops), gathering_(std::make_shared<Gathering>(stores)) {}
  // An input that comes later must not touch the query.
  ~StoredQuery() override { gathering_->stopped.store(true, std::memory_order_release); }

  void setPredicate(std::string predicate) override { predicate_ = std::move(predicate); }
  // Every attribute of a match is at hand anyway.
  void setValueListAttributes(std::vector<std::string>) override {}
  void setSearchScopes(std::vector<Location> scopes) override { scopes_ = std::move(scopes); }

  ObserverToken addFinishObserver(FinishObserver observer) override {
    return gathering_->observers.add(std::move(observer));
  }
  void removeFinishObserver(ObserverToken token) override { gathering_->observers.remove(token); }

  bool start() override;
  void stop() override;
  bool isStopped() const override { return gathering_->stopped.load(std::memory_order_acquire); }

  std::size_t resultCount() const override;
  std::unique_ptr<MetadataResult> resultAtIndex(std::size_t index) const override;

 private:
  bool addScope(const Location& scope, const PredicateSql& sql);
  void gather();

  EventLoops& loops_;
  EventLoop* startingLoop_ = nullptr;
  std::string predicate_;
  std::vector<Location> scopes_;
  std::shared_ptr<Gathering> gathering_;
};

bool StoredQuery::start() {
  const auto parsed = parsePredicate(predicate_);
  const auto* predicate = std::get_if<Predicate>(&parsed);
  if (predicate == nullptr) return false;
  const PredicateSql sql = compilePredicate(*predicate);
  for (const Location& scope : scopes_) {
    if (!addScope(scope, sql)) return false;
  }
  startingLoop_ = &loops_.current();
  gather();
  return true;
}

// False when the scope's store cannot be searched. A volume without a store is searched in vain.
bool StoredQuery::addScope(const Location& scope, const PredicateSql& sql) {
  const auto store = gathering_->stores.storeOf(normalizedPath(scope.path()));
  if (!store.ok()) return store.error().code == kStoreMissing;
  auto search = StoreSearch::begin(*store.value(), sql);
  if (!search.ok()) return false;
  gathering_->matches.push_back({store.value(), std::move(search).value(), {}});
  return true;
}

// Queues the next piece of the search; the last one queues the end of the gathering on the main loop.
void StoredQuery::gather() {
  startingLoop_->post([this, gathering = gathering_] {
    if (gathering->stopped.load(std::memory_order_acquire)) return;  // `this` may be gone
    for (StoreMatches& found : gathering->matches) {
      if (found.search.isDone()) continue;
      // What has been found so far stands; the next query over a store that fails does not start.
      const auto more = found.search.findMore(found.items);
      if (!more.ok()) gathering->stores.giveUp(*found.store, more.error());
      return gather();
    }
    // Whoever drops a query before its end has removed his observers, and nobody is told.
    loops_.main().post([this, gathering] { gathering->observers.notify(*this); });
  });
}

void StoredQuery::stop() {
  gathering_->stopped.store(true, std::memory_order_release);
  if (startingLoop_ != nullptr) startingLoop_->post([] {});  // ends the pass that waits for the gathering
}

std::size_t StoredQuery::resultCount() const {
  std::size_t count = 0;
  for (const StoreMatches& found : gathering_->matches) count += found.items.size();
  return count;
}

std::unique_ptr<MetadataResult> StoredQuery::resultAtIndex(std::size_t index) const {
  for (const StoreMatches& found : gathering_->matches) {
    if (index < found.items.size()) return std::make_unique<StoredResult>(*found.store, found.items[index]);
    index -= found.items.size();
  }
  return nullptr;
}

}  // namespace

std::unique_ptr<MetadataQuery> makeStoredQuery(VolumeStores& stores, EventLoops& loops) {
  return std::make_unique<StoredQuery>(stores, loops);
}

std::optional<MetadataValue> StoredResult::valueForAttribute(std::string_view attribute) const {
  auto value = store_.attribute(item_, attribute);
  if (!value.ok()) return std::nullopt;
  return std::move(value).value();
}

}  // namespace norvex
