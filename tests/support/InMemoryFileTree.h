// The file tree that the in-memory file roles answer from. Starts as an empty root folder.
//
// Changed before the code under test runs; read from one thread at a time.
#pragma once

#include <string>
#include <string_view>

#include "tests/support/TreeItem.h"

namespace norvex {

class InMemoryFileTree {
 public:
  // Puts `item` into the folder at the absolute path `folderPath`, in place of an item of its name. Folders
  // that are missing on the way are made.
  void put(std::string_view folderPath, TreeItem item);

  // The item at an absolute path, nullptr when there is none or it has vanished. A link is the link itself.
  const TreeItem* find(std::string_view path) const;

  // The same, but a link leads to what it points at.
  const TreeItem* follow(std::string_view path) const;

 private:
  TreeItem root_ = folder("");
};

}  // namespace norvex
