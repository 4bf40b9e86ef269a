// Putting a new content in the place of a file so that at every moment, whatever dies, the old or the new one
// is there whole.
//
// Made, used and destroyed on one thread. Several processes may replace the same file at once: from making
// the object to its end the others wait, so that what is read in between cannot be lost to one of them.
#pragma once

#include <string>
#include <string_view>

#include "platform/FileDescriptor.h"

namespace norvex {

class FileReplacement {
 public:
  // Locks the folder of the file at `path`, which exists, and removes what processes that were killed have
  // left unfinished beside the file. Where others hold the lock for seconds, or the file system has no locks,
  // goes on without.
  explicit FileReplacement(std::string path);

  // Gives the file the content `text` with mode 0600, safe against a loss of power when this returns.
  // `keptAs`, when it is not empty, is the path under which the file that stood there before is kept. 0, or
  // the errno value; then the old file is as it was and nothing is left beside it.
  int commit(std::string_view text, const std::string& keptAs = "");

 private:
  void removeUnfinished() const;
  int exchange(const std::string& unfinished, const std::string& keptAs) const;

  std::string path_;
  std::string folderPath_;
  std::string unfinishedPrefix_;
  FileDescriptor folder_;
};

}  // namespace norvex
