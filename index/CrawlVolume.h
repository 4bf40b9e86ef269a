// The volume that a crawl is about: how its folders are opened without ever leaving it.
//
// Shared by the crawl's threads; const but for what it learns about the file system.
#pragma once

#include <atomic>
#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

#include "platform/FileDescriptor.h"
#include "platform/Result.h"

struct statx;

namespace norvex {

// Which file system is mounted at a path, as text that differs for different ones.
Result<std::string> fileSystemIdAt(const std::string& path);

// A folder that stays open because folders in it are going to be opened; empty for one that does not.
using KeptFolder = std::shared_ptr<const FileDescriptor>;

class CrawlVolume {
 public:
  // `leftOutFolder`: a folder that is no item of any volume, where it exists.
  static Result<CrawlVolume> open(const std::string& root, const std::string& leftOutFolder);

  CrawlVolume(CrawlVolume&& other) noexcept;

  const std::string& root() const { return root_; }
  int rootFd() const { return fd_.number(); }

  // The absolute path of what is at `path` below the root.
  std::string absolute(std::string_view path) const;

  // Opens a folder below the root; an empty path is the root. No part of the path is followed when it is a
  // link or another volume. Any length. errno on failure: EXDEV for another volume.
  // `around`: the folder that it is in, where that has been kept, which saves the kernel the way from the
  // root.
  Result<FileDescriptor> openFolder(const std::string& path, const KeptFolder& around = nullptr) const;

  // Keeps a folder open, unless too many are.
  KeptFolder keep(FileDescriptor folder) const;

  // Whether there is a regular file at `path` below an open folder, no part of which is a link.
  bool holdsFile(int folder, std::string_view path) const;

  // Whether what statx() says is an item of this volume, and not the root of what is mounted over one.
  bool holds(const struct statx& status) const;

  bool isLeftOut(const struct statx& status) const;

  // Flags for statx() on an item: a border whose server does not answer must not hold up the crawl of a local
  // volume.
  int statFlags() const { return statFlags_; }

  // Whether it is of the kind of file system that has snapshots among its folders.
  bool mayHaveSnapshots() const { return mayHaveSnapshots_; }

  bool hasAttributes() const { return hasAttributes_.load(std::memory_order_relaxed); }
  void noteNoAttributes() const { hasAttributes_.store(false, std::memory_order_relaxed); }

 private:
  CrawlVolume() = default;

  Result<FileDescriptor> openBelow(int folder, std::string_view path, int flags) const;
  Result<FileDescriptor> openPart(int folder, const std::string& path, int flags) const;

  std::string root_;
  FileDescriptor fd_;
  std::uint64_t mount_ = 0;
  std::uint64_t device_ = 0;
  std::uint64_t leftOutDevice_ = 0, leftOutInode_ = 0;
  int statFlags_ = 0;
  bool mayHaveSnapshots_ = false;
  bool hasOpenat2_ = true;
  mutable std::atomic<bool> hasAttributes_{true};
  mutable std::atomic<int> keptFolders_{0};
};

}  // namespace norvex
