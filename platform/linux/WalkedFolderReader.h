// Reads a folder for a walk: its names, in byte order, and with one statx call each what the items are.
//
// Each thread that reads folders has a reader of its own.
#pragma once

#include <list>
#include <string>
#include <vector>

#include "platform/FileDescriptor.h"
#include "platform/linux/FolderNames.h"
#include "platform/linux/NamedStreams.h"
#include "platform/linux/WalkedFolder.h"

namespace norvex {

// What comes of reading a folder, beside what then stands in the folder itself.
struct ReadFolder {
  FileDescriptor descriptor;
  std::list<WalkedFolder> subfolders;  // in walk order
};

class WalkedFolderReader {
 public:
  // `marksWanted`: whether to find out which folders are marked as packages.
  explicit WalkedFolderReader(bool marksWanted) : marksWanted_(marksWanted) {}

  // Reads the folder, which lies in the open folder `parent`. A folder that is no longer there, or is no
  // folder any more, reads as empty. One that is its own ancestor is not read: ELOOP.
  ReadFolder read(WalkedFolder& folder, const FileDescriptor& parent);

  // Reads the root of a walk. That it is missing, a link or no folder is an error there.
  ReadFolder readRoot(WalkedFolder& root, const std::string& path);

 private:
  void forgetHugeFolder();
  void readOpen(WalkedFolder& folder, ReadFolder& result);
  void readItem(WalkedFolder& folder, const char* name, ReadFolder& result);

  const bool marksWanted_;
  NamedStreams streams_;
  // Of the folder that is being read, until what is needed of it becomes its own in the size that it takes.
  FolderNames listed_;
  std::vector<WalkedItem> items_;
  std::vector<char> names_;
};

}  // namespace norvex
