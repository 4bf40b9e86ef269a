// The metadata index of a machine on which no volume has been indexed: every query starts and finds nothing,
// no path has an item.
#pragma once

#include "platform/EventLoop.h"
#include "platform/MetadataIndex.h"

namespace norvex {

class UnindexedVolumes final : public MetadataIndex {
 public:
  // `loops` outlives this object and every query that it makes.
  explicit UnindexedVolumes(EventLoops& loops) : loops_(loops) {}

  std::unique_ptr<MetadataQuery> createQuery() override;
  std::unique_ptr<MetadataResult> itemAtPath(const std::string& path) override;

 private:
  EventLoops& loops_;
};

}  // namespace norvex
