// The open descriptors of a walk's folders.
//
// A folder is kept open until all of its subfolders have been opened, so that each is opened by its name
// alone. In a tree that is deeper than a process may have files open, the folders nearest to the root are
// closed, and opened again on the way back: step by step below the root's descriptor, following no link, and
// only when it is still the same folder. So neither the depth of a tree nor what is done to it meanwhile
// leads a walk astray.
//
// Used under the lock of the ReadAhead.
#pragma once

#include <cstddef>
#include <memory>
#include <vector>

#include "platform/FileDescriptor.h"
#include "platform/linux/WalkedFolder.h"

namespace norvex {

class FolderDescriptors {
 public:
  using Descriptor = std::shared_ptr<const FileDescriptor>;

  // Keeps the descriptor of a folder that has subfolders, until each of them has had it.
  void keep(WalkedFolder& folder, FileDescriptor descriptor);

  // The descriptor of the folder's parent, for the one opening of the folder. nullptr when it had been closed
  // and cannot be opened again; then `error` is the errno value, ENOENT when something else is in its place.
  Descriptor parentOf(WalkedFolder& folder, int& error);

  // Closes all that can be opened again and keeps fewer from now on: the process has too many files open.
  void makeRoom();

 private:
  void hold(WalkedFolder& folder, Descriptor descriptor);
  void letGo(WalkedFolder& folder);
  void closeFirst(std::size_t count);
  int reopen(WalkedFolder& folder);

  // Far below the usual limit of 1024 files, with room for walks at the same time.
  std::size_t limit_ = 128;
  std::vector<WalkedFolder*> open_;  // without the root; those that were opened first come first
};

}  // namespace norvex
