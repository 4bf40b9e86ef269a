// Walks of the in-memory file tree, in the order that the role promises.
#pragma once

#include <memory>
#include <span>
#include <string>
#include <vector>

#include "platform/DirectoryEnumerator.h"
#include "tests/support/CallJournal.h"
#include "tests/support/InMemoryFileTree.h"

namespace norvex {

class InMemoryDirectoryEnumeration final : public DirectoryEnumeration {
 public:
  struct Walk {
    std::string rootPath;
    bool rootIsFolder;
    std::vector<ResourceKey> prefetch;
  };

  InMemoryDirectoryEnumeration(CallJournal& calls, const InMemoryFileTree& tree)
      : calls_(calls), tree_(tree) {}

  std::unique_ptr<DirectoryEnumerator> enumerator(const Location& root, std::span<const ResourceKey> prefetch,
                                                  ErrorHandler errorHandler) override;

  // The walks that were begun.
  std::vector<Walk> walks;

 private:
  CallJournal& calls_;
  const InMemoryFileTree& tree_;
};

}  // namespace norvex
