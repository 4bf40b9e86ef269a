#include "tool/WatchedMetadataIndex.h"

#include <utility>
#include <vector>

namespace norvex {
namespace {

class WatchedQuery final : public MetadataQuery {
 public:
  WatchedQuery(std::unique_ptr<MetadataQuery> query, QueryWatcher& watcher)
      : query_(std::move(query)), watcher_(watcher) {}

  void setPredicate(std::string predicate) override { query_->setPredicate(std::move(predicate)); }
  void setValueListAttributes(std::vector<std::string> attributes) override {
    query_->setValueListAttributes(std::move(attributes));
  }
  void setSearchScopes(std::vector<Location> scopes) override {
    if (!scopes.empty()) volume_ = scopes.front().path();
    query_->setSearchScopes(std::move(scopes));
  }

  ObserverToken addFinishObserver(FinishObserver observer) override {
    return query_->addFinishObserver([this, observer = std::move(observer)](MetadataQuery&) {
      observer(*this);
      watcher_.queryEnds();
    });
  }
  void removeFinishObserver(ObserverToken token) override { query_->removeFinishObserver(token); }

  bool start() override {
    const bool started = query_->start();
    watcher_.queryStarts(volume_, started);
    return started;
  }
  void stop() override { query_->stop(); }
  bool isStopped() const override { return query_->isStopped(); }

  std::size_t resultCount() const override { return query_->resultCount(); }
  std::unique_ptr<MetadataResult> resultAtIndex(std::size_t index) const override {
    watcher_.matchIsRead(index, query_->resultCount());
    return query_->resultAtIndex(index);
  }

 private:
  std::unique_ptr<MetadataQuery> query_;
  QueryWatcher& watcher_;
  std::string volume_;
};

}  // namespace

std::unique_ptr<MetadataQuery> WatchedMetadataIndex::createQuery() {
  return std::make_unique<WatchedQuery>(index_.createQuery(), watcher_);
}

}  // namespace norvex
