// Where a file or folder lies: an absolute path, marked as a folder or not.
//
// Used by every room, on any thread. A plain value; copies are independent.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <utility>

namespace norvex {

// What a walk has already learnt about an item while it read the item's folder. It is a snapshot of that
// moment.
struct ItemFacts {
  // 0, or the errno value with which the item's attributes could not be read; then nothing below means
  // anything.
  int error = 0;
  bool isDirectory = false;
  // Known only when the walk was asked for it.
  std::optional<bool> isPackage;
  // Bytes of all data streams. Means nothing for a folder, which has no total file size.
  std::uint64_t totalFileSize = 0;
};

class Location {
 public:
  Location() = default;
  static Location file(std::string path) { return Location(std::move(path), false); }
  static Location folder(std::string path) { return Location(std::move(path), true); }

  // The path's bytes as the file system has them; not necessarily UTF-8, possibly longer than PATH_MAX.
  const std::string& path() const { return path_; }
  bool isFolder() const { return isFolder_; }

  // The location below this one that `relativePath` leads to. This location's path ends in no more than one
  // "/".
  Location appending(std::string_view relativePath, bool isFolder) const;

  // The form in which a location stands in a log line: "file://" and the path. Unreserved characters and "/"
  // stand as they are, every other byte as %XX in capitals; a location marked as a folder ends in "/".
  std::string urlText() const;

  // What the walk that yielded this location knows about it, so that reading its resource values asks the
  // kernel nothing. Absent for a location that was made from a path.
  const std::optional<ItemFacts>& facts() const { return facts_; }

  // For walks only: turns this location into the item `name` of the folder whose path, ending in "/", is the
  // first `folderLength` bytes of the present path. Reuses the path's memory.
  void moveToItem(std::size_t folderLength, std::string_view name, const ItemFacts& facts);

 private:
  Location(std::string path, bool isFolder) : path_(std::move(path)), isFolder_(isFolder) {}

  std::string path_;
  bool isFolder_ = false;
  std::optional<ItemFacts> facts_;
};

// `path` without repeated separators, "." components and a trailing separator, with ".." components resolved
// by text alone. The root stays "/".
std::string normalizedPath(std::string_view path);

// `path` with a leading "~" component replaced by `homeFolder`. Any other path comes back as it is.
std::string expandingTilde(std::string_view path, std::string_view homeFolder);

}  // namespace norvex
