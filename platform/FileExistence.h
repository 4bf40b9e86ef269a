// Whether there is something at a path.
//
// Called on the thread of the run.
#pragma once

#include <string>

namespace norvex {

class FileExistence {
 public:
  virtual ~FileExistence() = default;

  // True when a file or folder exists at the path; a link counts when what it leads to exists. False also
  // when that cannot be told.
  virtual bool exists(const std::string& path) = 0;
};

}  // namespace norvex
