// A file, folder, package or link of a test's file tree, written as one nested expression:
//
//   folder("Desktop", {package("A.app", {file("x", 5)}), folder("closed").unreadable(EACCES), link("l",
//   "/etc", 4)})
#pragma once

#include <cstdint>
#include <map>
#include <string>
#include <vector>

#include "platform/ResourceValues.h"

namespace norvex {

struct TreeItem {
  enum class Kind { file, folder, package, link };

  std::string name;
  Kind kind = Kind::folder;
  std::uint64_t size = 0;
  std::string target;
  std::vector<TreeItem> children;
  int listingError = 0;
  int attributeError = 0;
  bool hasTotalSize = true;
  bool hasVanished = false;
  std::map<ResourceKey, int> keyErrors;

  bool isDirectory() const { return kind == Kind::folder || kind == Kind::package; }

  // Each gives the same item with one thing gone wrong. `error` is an errno value.

  // A folder whose contents cannot be listed; its own attributes can be read.
  TreeItem unreadable(int error) const;
  // An item that can be seen in its folder, but whose attributes cannot be read.
  TreeItem withoutAttributes(int error) const;
  // An item that one value cannot be read of, whatever else is known about it.
  TreeItem failing(ResourceKey key, int error) const;
  // A file that has no total size.
  TreeItem withoutTotalSize() const;
  // An item that is still listed in its folder and gone when somebody looks at it.
  TreeItem vanishing() const;
};

TreeItem file(std::string name, std::uint64_t size);
TreeItem folder(std::string name, std::vector<TreeItem> children = {});
TreeItem package(std::string name, std::vector<TreeItem> children = {});
// `target` is an absolute path, `size` the link's own size.
TreeItem link(std::string name, std::string target, std::uint64_t size);

}  // namespace norvex
