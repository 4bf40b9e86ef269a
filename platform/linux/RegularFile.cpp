#include "platform/linux/RegularFile.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>

namespace norvex {
namespace {

constexpr int kOpenFlags = O_RDONLY | O_NOFOLLOW | O_NONBLOCK | O_NOCTTY | O_CLOEXEC;

bool isRegularFile(int folder, const char* path) {
  struct stat attributes = {};
  return ::fstatat(folder, path, &attributes, AT_SYMLINK_NOFOLLOW) == 0 && S_ISREG(attributes.st_mode);
}

}  // namespace

std::optional<RegularFile> RegularFile::openAt(int folder, const char* path) {
  // Asked before opening, since the opening itself releases whoever waits at the other end of a FIFO.
  if (!isRegularFile(folder, path)) return std::nullopt;
  return openKnownAt(folder, path);
}

std::optional<RegularFile> RegularFile::openKnownAt(int folder, const char* path) {
  FileDescriptor file(::openat(folder, path, kOpenFlags | O_NOATIME));
  // Only the owner of a file may leave its time of last access alone.
  if (!file && errno == EPERM) file = FileDescriptor(::openat(folder, path, kOpenFlags));
  if (!file) return std::nullopt;
  // Asked of what was opened: something else may have taken the name in between.
  struct stat attributes = {};
  if (::fstat(file.number(), &attributes) != 0 || !S_ISREG(attributes.st_mode)) return std::nullopt;
  return RegularFile(std::move(file), static_cast<std::uint64_t>(attributes.st_size));
}

std::size_t RegularFile::read(std::uint64_t offset, std::span<char> buffer) {
  std::size_t filled = 0;
  while (filled < buffer.size()) {
    const auto rest = buffer.subspan(filled);
    const auto got = ::pread(file_.number(), rest.data(), rest.size(), static_cast<off_t>(offset + filled));
    if (got < 0 && errno == EINTR) continue;
    if (got <= 0) break;
    filled += static_cast<std::size_t>(got);
  }
  return filled;
}

}  // namespace norvex
