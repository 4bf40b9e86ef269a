// The observers that wait for a query's gathering to end, and the rule that nobody removes one while it is at
// work.
//
// Any thread may call; the lock is held only while the list changes, never while an observer runs.
#pragma once

#include <condition_variable>
#include <map>
#include <mutex>
#include <thread>

#include "platform/MetadataIndex.h"

namespace norvex {

class FinishObservers {
 public:
  MetadataQuery::ObserverToken add(MetadataQuery::FinishObserver observer);

  // Returns once the observer is not running, unless the caller is the observer itself.
  void remove(MetadataQuery::ObserverToken token);

  // Calls every observer that is registered at its turn, once.
  void notify(MetadataQuery& query);

 private:
  std::mutex mutex_;
  std::condition_variable idle_;
  std::map<MetadataQuery::ObserverToken, MetadataQuery::FinishObserver> observers_;
  MetadataQuery::ObserverToken lastToken_ = 0;
  MetadataQuery::ObserverToken runningToken_ = 0;  // 0: none is running
  std::thread::id runningThread_;
};

}  // namespace norvex
