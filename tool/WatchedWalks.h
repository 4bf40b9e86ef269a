// Walks that go as those of another role do, and tell of each item that they come to.
//
// Installed by the companion command for its scans. Threads: as platform/DirectoryEnumerator.h says.
#pragma once

#include <functional>
#include <memory>
#include <span>
#include <utility>

#include "platform/DirectoryEnumerator.h"

namespace norvex {

class WatchedWalks final : public DirectoryEnumeration {
 public:
  // `walks` and what `itemIsWalked` refers to outlive this object and its walks.
  WatchedWalks(DirectoryEnumeration& walks, std::function<void()> itemIsWalked)
      : walks_(walks), itemIsWalked_(std::move(itemIsWalked)) {}

  std::unique_ptr<DirectoryEnumerator> enumerator(const Location& root, std::span<const ResourceKey> prefetch,
                                                  ErrorHandler errorHandler) override {
    return std::make_unique<Walk>(walks_.enumerator(root, prefetch, std::move(errorHandler)), itemIsWalked_);
  }

 private:
  class Walk final : public DirectoryEnumerator {
   public:
    Walk(std::unique_ptr<DirectoryEnumerator> walk, const std::function<void()>& itemIsWalked)
        : walk_(std::move(walk)), itemIsWalked_(itemIsWalked) {}

    const Location* next() override {
      itemIsWalked_();
      return walk_->next();
    }
    std::uint64_t level() const override { return walk_->level(); }

   private:
    std::unique_ptr<DirectoryEnumerator> walk_;
    const std::function<void()>& itemIsWalked_;
  };

  DirectoryEnumeration& walks_;
  std::function<void()> itemIsWalked_;
};

}  // namespace norvex
