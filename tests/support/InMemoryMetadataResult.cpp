#include "tests/support/InMemoryMetadataResult.h"

#include <algorithm>
#include <utility>

namespace norvex {

InMemoryMetadataResult::InMemoryMetadataResult(CallJournal& calls,
                                               std::shared_ptr<InMemoryMetadataIndex::Liveness> liveness,
                                               std::string name, Attributes attributes)
    : calls_(calls),
      liveness_(std::move(liveness)),
      name_(std::move(name)),
      attributes_(std::move(attributes)) {
  const int alive = ++liveness_->now;
  liveness_->most = std::max(liveness_->most.load(), alive);
}

std::optional<MetadataValue> InMemoryMetadataResult::valueForAttribute(std::string_view attribute) const {
  calls_.add("attribute " + std::string(attribute) + " " + name_);
  const auto found = attributes_.find(attribute);
  if (found == attributes_.end()) return std::nullopt;
  return found->second;
}

}  // namespace norvex
