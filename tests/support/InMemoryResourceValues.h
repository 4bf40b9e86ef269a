// Resource values of the in-memory file tree, and the capacities of volumes that the test names.
#pragma once

#include <map>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "platform/ResourceValues.h"
#include "tests/support/CallJournal.h"
#include "tests/support/InMemoryFileTree.h"

namespace norvex {

class InMemoryResourceValues final : public ResourceValues {
 public:
  InMemoryResourceValues(CallJournal& calls, const InMemoryFileTree& tree) : calls_(calls), tree_(tree) {}

  Result<std::optional<ResourceValue>> value(const Location& location, ResourceKey key) override;

  // Fails with ENOENT for a path that is in `capacities` as little as in the tree.
  Result<ResourceValueTable> values(const Location& location, std::span<const ResourceKey> keys) override;

  // What a volume says of itself, by its root's path; a key that is missing here is missing in the answer.
  std::map<std::string, ResourceValueTable> capacities;

  // Puts another size in place of the tree's, for the times that the size of the file at a path is asked: the
  // first answer first, then the tree's.
  std::map<std::string, std::vector<ResourceValue>> nextSizes;

 private:
  Result<std::optional<ResourceValue>> answer(const Location& location, ResourceKey key);

  CallJournal& calls_;
  const InMemoryFileTree& tree_;
};

// The key as the journal writes it.
std::string nameOf(ResourceKey key);

}  // namespace norvex
