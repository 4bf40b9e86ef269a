// Walks of what the kernel has mounted.
//
// How a walk works: a folder is read whole - its names, then a statx call for each - and put into byte order
// (WalkedFolderReader). What it yields are the folder's items one after the other, and after each folder
// among them that folder's own items. Folders that are going to be walked are read ahead by a second thread
// (ReadAhead). Opened folders and what became of their descriptors in deep trees are FolderDescriptors'
// business.
#pragma once

#include "platform/DirectoryEnumerator.h"

namespace norvex {

class LinuxDirectoryEnumeration final : public DirectoryEnumeration {
 public:
  std::unique_ptr<DirectoryEnumerator> enumerator(const Location& root, std::span<const ResourceKey> prefetch,
                                                  ErrorHandler errorHandler) override;
};

}  // namespace norvex
