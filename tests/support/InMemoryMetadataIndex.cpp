#include "tests/support/InMemoryMetadataIndex.h"

#include "tests/support/InMemoryMetadataQuery.h"
#include "tests/support/InMemoryMetadataResult.h"

namespace norvex {

std::unique_ptr<MetadataQuery> InMemoryMetadataIndex::createQuery() {
  calls_.add("createQuery");
  queries.push_back(std::make_shared<QueryRecord>());
  return std::make_unique<InMemoryMetadataQuery>(*this, queries.back());
}

std::unique_ptr<MetadataResult> InMemoryMetadataIndex::itemAtPath(const std::string& path) {
  calls_.add("itemAtPath " + path);
  const auto found = volumes.find(path);
  if (found == volumes.end() || !found->second.hasItem) return nullptr;
  const IndexedVolume& volume = found->second;
  InMemoryMetadataResult::Attributes attributes{{std::string(kMDItemPath), path}};
  if (volume.hasHealthCheck) attributes.emplace(kMDStoreLastHealthCheck, MetadataDate{1});
  if (volume.accumulatedSizes) attributes.emplace(kMDStoreAccumulatedSizes, *volume.accumulatedSizes);
  return std::make_unique<InMemoryMetadataResult>(calls_, liveness, path, std::move(attributes));
}

}  // namespace norvex
