#include "platform/linux/Files.h"

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>

#include <algorithm>
#include <cerrno>
#include <thread>

#include "platform/FileDescriptor.h"

namespace norvex {
namespace {

constexpr mode_t kPrivateFolderMode = 0700;
constexpr std::size_t kReadStep = std::size_t{16} * 1024;
constexpr std::chrono::milliseconds kLockStep{10};

std::string parentOf(const std::string& path) {
  const std::size_t slash = path.find_last_of('/');
  if (slash == std::string::npos) return ".";
  return slash == 0 ? "/" : path.substr(0, slash);
}

bool isFolder(const std::string& path) {
  struct stat status {};
  return ::stat(path.c_str(), &status) == 0 && S_ISDIR(status.st_mode);
}

// Reads until `limit` bytes are there or the file ends. What the file says about its own size is no help: the
// kernel's own files say 0 or a page.
int readUpTo(int descriptor, std::size_t limit, std::string& text) {
  while (text.size() < limit) {
    const std::size_t had = text.size();
    text.resize(std::min(limit, had + kReadStep));
    const ssize_t count = ::read(descriptor, text.data() + had, text.size() - had);
    const int error = count < 0 ? errno : 0;
    text.resize(had + static_cast<std::size_t>(std::max<ssize_t>(count, 0)));
    if (error == EINTR) continue;
    if (error != 0) return error;
    if (count == 0) return 0;
  }
  return 0;
}

}  // namespace

Result<std::string> readStartOfFile(const std::string& path, std::size_t limit) {
  const FileDescriptor file(::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK | O_NOCTTY));
  if (!file) return systemError(errno);
  struct stat status {};
  if (::fstat(file.number(), &status) != 0) return systemError(errno);
  if (!S_ISREG(status.st_mode)) return systemError(S_ISDIR(status.st_mode) ? EISDIR : EINVAL);
  std::string text;
  if (const int error = readUpTo(file.number(), limit, text)) return systemError(error);
  return text;
}

Result<std::string> readWholeFile(const std::string& path, std::size_t limit) {
  Result<std::string> text = readStartOfFile(path, limit + 1);
  if (text && text.value().size() > limit) return systemError(EFBIG);
  return text;
}

int makePrivateFolders(const std::string& path) {
  if (isFolder(path)) return 0;
  const std::string parent = parentOf(path);
  if (parent != path) {
    if (const int error = makePrivateFolders(parent)) return error;
  }
  if (::mkdir(path.c_str(), kPrivateFolderMode) == 0) return syncFolder(parent);
  const int error = errno;
  return error == EEXIST && isFolder(path) ? 0 : error;  // another process may have been faster
}

int writeAll(int descriptor, std::string_view text) {
  while (!text.empty()) {
    const ssize_t count = ::write(descriptor, text.data(), text.size());
    if (count < 0) {
      if (errno == EINTR) continue;
      return errno;
    }
    text.remove_prefix(static_cast<std::size_t>(count));
  }
  return 0;
}

int syncFolder(const std::string& path) {
  const FileDescriptor folder(::open(path.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
  if (!folder || ::fsync(folder.number()) != 0) return errno;
  return 0;
}

bool lockWithin(int descriptor, std::chrono::milliseconds limit) {
  // flock(2) can wait for ever or not at all; a limit has to be waited out in steps.
  const auto deadline = std::chrono::steady_clock::now() + limit;
  while (::flock(descriptor, LOCK_EX | LOCK_NB) != 0) {
    if (errno != EWOULDBLOCK && errno != EINTR) return false;
    if (std::chrono::steady_clock::now() >= deadline) return false;
    std::this_thread::sleep_for(kLockStep);
  }
  return true;
}

}  // namespace norvex
