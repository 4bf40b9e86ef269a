#include "platform/linux/CallablePath.h"

#include <cerrno>
#include <climits>

namespace norvex {
namespace {
constexpr std::size_t kLongestPath = PATH_MAX - 1;
}

CallablePath::CallablePath(std::string_view path) {
  while (path.size() > kLongestPath) {
    const std::size_t end = path.rfind('/', kLongestPath);
    if (end == std::string_view::npos || end == 0) {
      error_ = ENAMETOOLONG;
      return;
    }
    const std::string part(path.substr(0, end));
    FileDescriptor next(::openat(folder(), part.c_str(), O_PATH | O_DIRECTORY | O_CLOEXEC));
    if (!next) {
      error_ = errno;
      return;
    }
    folder_ = std::move(next);
    path.remove_prefix(end);
    while (!path.empty() && path.front() == '/') path.remove_prefix(1);
  }
  rest_ = path;
  if (rest_.empty() && folder_) rest_ = ".";
}

std::string_view withoutTrailingSeparators(std::string_view path) {
  while (path.size() > 1 && path.back() == '/') path.remove_suffix(1);
  return path;
}

}  // namespace norvex
