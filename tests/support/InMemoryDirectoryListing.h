// One-level listings of the in-memory file tree.
#pragma once

#include <algorithm>
#include <optional>
#include <string>
#include <vector>

#include "platform/DirectoryListing.h"
#include "tests/support/CallJournal.h"
#include "tests/support/InMemoryFileTree.h"

namespace norvex {

class InMemoryDirectoryListing final : public DirectoryListing {
 public:
  InMemoryDirectoryListing(CallJournal& calls, const InMemoryFileTree& tree) : calls_(calls), tree_(tree) {}

  std::optional<std::vector<std::string>> names(const std::string& folderPath) override {
    calls_.add("names " + folderPath);
    const TreeItem* folder = tree_.follow(folderPath);
    if (folder == nullptr || !folder->isDirectory() || folder->listingError != 0) return std::nullopt;
    std::vector<std::string> found;
    for (const TreeItem& child : folder->children) found.push_back(child.name);
    std::sort(found.begin(), found.end());
    return found;
  }

 private:
  CallJournal& calls_;
  const InMemoryFileTree& tree_;
};

}  // namespace norvex
