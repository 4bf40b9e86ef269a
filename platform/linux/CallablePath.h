// A path of any length in the form in which a system call takes it: relative to a folder, and never longer
// than PATH_MAX.
//
// Made for one or a few calls, on any thread. Valid for as long as it lives, whatever becomes of the text
// that it was made of.
#pragma once

#include <fcntl.h>

#include <string>
#include <string_view>

#include "platform/FileDescriptor.h"

namespace norvex {

class CallablePath {
 public:
  // Opens the part of the path that is too long, folder by folder, following links as the kernel does in the
  // middle of a path. A path that fits needs no system call.
  explicit CallablePath(std::string_view path);

  // 0, or the errno value with which a folder on the way could not be opened.
  int error() const { return error_; }

  // The pair for the ...at() calls. Only when error() is 0.
  int folder() const { return folder_ ? folder_.number() : AT_FDCWD; }
  const char* path() const { return rest_.c_str(); }

 private:
  FileDescriptor folder_;
  std::string rest_;
  int error_ = 0;
};

// `path` without separators at its end, since the kernel follows a link whose name is followed by one. The
// root stays "/".
std::string_view withoutTrailingSeparators(std::string_view path);

}  // namespace norvex
