// One folder of a walk, from the moment at which it is found in its parent until the walk has left it.
//
// It passes through three hands, one after the other: the thread that reads it, the table of open
// descriptors, the thread that walks.
#pragma once

#include <cassert>
#include <cstddef>
#include <cstdint>
#include <list>
#include <memory>
#include <vector>

#include "platform/FileDescriptor.h"
#include "platform/linux/ItemAttributes.h"

namespace norvex {

// An item as the walk is going to yield it; its name stands in the folder's names, in the same order.
struct WalkedItem {
  std::uint64_t totalSize;  // bytes of all data streams; 0 for a folder
  std::uint16_t nameLength;
  std::int16_t error;  // 0, or the errno value with which its attributes could not be read
  bool isFolder;
};

struct WalkedFolder {
  // The root of a walk.
  WalkedFolder() = default;
  WalkedFolder(WalkedFolder& itsParent, std::size_t itsNameStart, ItemIdentity itsIdentity)
      : parent(&itsParent), nameStart(itsNameStart), identity(itsIdentity) {}

  // Of any but the root.
  const char* name() const {
    assert(parent != nullptr);
    return parent->names.data() + nameStart;
  }

  WalkedFolder* const parent = nullptr;  // nullptr for the root
  const std::size_t nameStart = 0;       // in the parent's names
  ItemIdentity identity;  // as the reader of its parent saw it, the root's as its own reader did
  WalkedFolder* nextSibling = nullptr;  // the subfolder of the parent that comes after this one

  // Written by the thread that reads the folder, constant from then on.
  int error = 0;  // the errno value with which it could not be read whole
  bool isMarkedAsPackage = false;
  std::vector<WalkedItem> items;
  std::vector<char> names;  // one after the other, each with a zero byte at its end
  std::size_t memory = 0;   // bytes that all this takes; for the ReadAhead

  // Written by the walking thread.
  WalkedFolder* nextSubfolder = nullptr;  // the next one to be entered; set first by the reader
  std::size_t nextItem = 0;
  std::size_t nextName = 0;
  std::size_t pathLength = 0;  // of the folder's path, with the separator at its end
  std::uint64_t depth = 0;     // 0 for the root

  // The state of the reading: guarded by the lock of the ReadAhead.
  enum class State { unread, beingRead, read } state = State::unread;
  std::list<WalkedFolder>::iterator place;
  std::shared_ptr<const FileDescriptor>
      descriptor;  // open while subfolders are going to be opened, room permitting
  ItemIdentity identityWhenClosed;
  std::size_t unopenedSubfolders = 0;
};

}  // namespace norvex
