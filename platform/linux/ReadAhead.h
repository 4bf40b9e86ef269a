// Reads the folders of one walk, on the walking thread and, once the walk has proved to be a long one, on a
// second thread that reads ahead of it.
//
// Both take the earliest folder, in walk order, that nobody has begun to read; the subfolders that it turns
// out to have take its place in that order. What has been read and not yet walked is limited, so that memory
// does not grow with the tree. Where no thread can be made, the walk goes on alone.
#pragma once

#include <condition_variable>
#include <cstddef>
#include <list>
#include <mutex>
#include <string>
#include <thread>

#include "platform/linux/FolderDescriptors.h"
#include "platform/linux/WalkedFolder.h"
#include "platform/linux/WalkedFolderReader.h"

namespace norvex {

class ReadAhead {
 public:
  // Of a walk below the folder at `root`. `marksWanted`: whether to find out which folders are marked as
  // packages.
  ReadAhead(const std::string& root, bool marksWanted);
  ~ReadAhead();
  ReadAhead(const ReadAhead&) = delete;
  ReadAhead& operator=(const ReadAhead&) = delete;

  // For the walking thread.

  // The root, which is the first folder to be awaited.
  WalkedFolder& root() { return root_; }

  // Returns when the folder, the next one in walk order, has been read.
  void await(WalkedFolder& folder);

  // The walk has left the folder and everything below it: it is destroyed.
  void discard(WalkedFolder& folder);

 private:
  using Lock = std::unique_lock<std::mutex>;

  void startHelper();
  void help();
  bool mayReadOn() const { return unread_ > 0 && bytesAhead_ < kMostBytesAhead; }
  WalkedFolder& claim();
  void read(WalkedFolder& folder, WalkedFolderReader& reader, Lock& lock);
  ReadFolder readBelow(const FileDescriptor& parent, WalkedFolder& folder, WalkedFolderReader& reader);
  void publish(WalkedFolder& folder, ReadFolder result);
  void wakeHelper();

  // What may have been read ahead, in bytes of memory.
  static constexpr std::size_t kMostBytesAhead = std::size_t{512} << 10U;

  const std::string rootPath_;
  WalkedFolderReader reader_;        // the walking thread's
  WalkedFolderReader helperReader_;  // the helper's
  std::size_t itemsWalked_ = 0;      // until there is a helper

  std::mutex mutex_;  // guards all below
  std::condition_variable workIsThere_;
  std::condition_variable folderIsRead_;
  std::list<WalkedFolder> pending_;  // unread or being read, in walk order
  std::list<WalkedFolder> read_;
  WalkedFolder& root_;
  FolderDescriptors descriptors_;
  std::size_t unread_ = 1;
  std::size_t bytesAhead_ = 0;  // of memory, of what has been read and not yet walked
  bool helperWaits_ = false;
  bool walkWaits_ = false;
  bool stopping_ = false;

  std::thread helper_;
};

}  // namespace norvex
