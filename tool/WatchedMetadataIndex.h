// A metadata index that answers as another one does, and lets somebody watch what is asked of it.
//
// Installed by the companion command for its scans, so that the scan itself stays the agent's. Threads: as
// platform/MetadataIndex.h says.
#pragma once

#include <cstddef>
#include <memory>
#include <string>

#include "platform/MetadataIndex.h"

namespace norvex {

// Told of each query of a scan; on the thread that asks.
class QueryWatcher {
 public:
  virtual ~QueryWatcher() = default;

  // A query over the volume has been started, or cannot be.
  virtual void queryStarts(const std::string& volume, bool started) = 0;

  // The match with this number, of so many, is being looked at.
  virtual void matchIsRead(std::size_t index, std::size_t count) = 0;

  // All matches have been looked at.
  virtual void queryEnds() = 0;
};

class WatchedMetadataIndex final : public MetadataIndex {
 public:
  // Both outlive this object and its queries.
  WatchedMetadataIndex(MetadataIndex& index, QueryWatcher& watcher) : index_(index), watcher_(watcher) {}

  std::unique_ptr<MetadataQuery> createQuery() override;
  std::unique_ptr<MetadataResult> itemAtPath(const std::string& path) override {
    return index_.itemAtPath(path);
  }

 private:
  MetadataIndex& index_;
  QueryWatcher& watcher_;
};

}  // namespace norvex
