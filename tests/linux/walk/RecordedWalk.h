// What a walk yielded and told, in a form that tests compare.
#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "platform/DirectoryEnumerator.h"

namespace norvex {

struct RecordedWalk {
  std::vector<std::string> paths;  // below the root
  std::vector<std::uint64_t> levels;
  std::vector<Location> locations;
  std::vector<std::string> errors;  // "path below the root: code", "." for the root
  std::uint64_t totalSize = 0;      // of all that is no folder

  // The number of items of this path that were yielded.
  std::size_t count(const std::string& path) const;
};

struct WalkOptions {
  bool packages = false;
  // Called after each item, with its path below the root.
  std::function<void(const std::string&)> afterItem = {};
  // Called for each error, with the path of the folder; its result is the handler's.
  std::function<bool(const std::string&)> onError = {};
};

RecordedWalk walk(const Location& root, const WalkOptions& options = {});

}  // namespace norvex
