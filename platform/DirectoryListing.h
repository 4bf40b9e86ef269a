// The names in one folder.
//
// Called on the thread of the run.
#pragma once

#include <optional>
#include <string>
#include <vector>

namespace norvex {

class DirectoryListing {
 public:
  virtual ~DirectoryListing() = default;

  // The names of the folder's entries, one level, hidden ones included, without "." and "..", in byte order.
  // Absent when the folder is missing or cannot be read. A link to a folder is followed.
  virtual std::optional<std::vector<std::string>> names(const std::string& folderPath) = 0;
};

}  // namespace norvex
