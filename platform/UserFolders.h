// Where the user's own files are.
//
// Called on any thread.
#pragma once

#include <string>

namespace norvex {

class UserFolders {
 public:
  virtual ~UserFolders() = default;

  // The current user's home folder, an absolute path without a trailing separator. The same for the life of
  // the process.
  virtual const std::string& home() const = 0;
};

}  // namespace norvex
