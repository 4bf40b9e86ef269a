// A file tree on disk, written as one nested expression, in a temporary folder that goes with it:
//
//   const TreeOnDisk tree({folder("Desktop", {folder("A.app", {file("x", 5)}), link("l", "/etc")})});
//
// What cannot be made throws std::system_error, which ends the test.
#pragma once

#include <sys/types.h>

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "platform/Location.h"

namespace norvex::ondisk {

struct Item {
  enum class Kind { file, folder, link, hardLink, fifo };

  std::string name;
  Kind kind = Kind::file;
  std::uint64_t size = 0;  // of a file, which takes no room on disk
  std::string target;      // of a link: its text; of a hard link: a path below the tree's root
  std::vector<Item> children;
  std::optional<mode_t> mode;
  std::string attributeName;
  std::string attributeValue;

  // The same item with these permissions, set when its contents are there.
  Item withMode(mode_t permissions) const;
  // The same file or folder with one extended attribute.
  Item withAttribute(std::string itsName, std::string itsValue) const;
};

Item file(std::string name, std::uint64_t size = 0);
Item folder(std::string name, std::vector<Item> children = {});
Item link(std::string name, std::string target);
Item hardLink(std::string name, std::string pathBelowRoot);
Item fifo(std::string name);

// Where a tree lies. Thousands of files are made in memory, since a disk may take half a minute for them;
// where there is no such place they are made on disk after all.
enum class Medium { disk, memory };

class TreeOnDisk {
 public:
  explicit TreeOnDisk(const std::vector<Item>& items = {}, Medium medium = Medium::disk);
  ~TreeOnDisk();  // removes all of it, however deep it is and whatever its permissions are
  TreeOnDisk(const TreeOnDisk&) = delete;
  TreeOnDisk& operator=(const TreeOnDisk&) = delete;

  const std::string& path() const { return path_; }
  std::string path(std::string_view below) const { return path_ + '/' + std::string(below); }
  Location location() const { return Location::folder(path_); }

  // Adds items to the folder at `below`, which is "." for the root.
  void add(std::string_view below, const std::vector<Item>& items) const;

  // Adds a chain of `depth` folders of one name, the first in the root, and in each of them, the root
  // included, `items`. Returns the path of the deepest.
  std::string addChain(std::size_t depth, const std::string& name, const std::vector<Item>& items = {}) const;

  // Removes what is at `below`, a folder with all that is in it.
  void remove(std::string_view below) const;

  // Removes everything but the root.
  void clear() const;

 private:
  std::string path_;
};

}  // namespace norvex::ondisk
