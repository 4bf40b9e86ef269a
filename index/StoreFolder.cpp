#include "index/StoreFolder.h"

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>

#include <array>
#include <cerrno>
#include <chrono>
#include <cstdint>
#include <cstdio>
#include <thread>
#include <utility>

namespace norvex {
namespace {

constexpr std::size_t kLongestPlainName = 160;
constexpr std::chrono::milliseconds kLockRetry{50};
constexpr std::string_view kCacheTag =
    "Signature: 8a477f597d28d172789f06886806bc55\n"
    "# This folder holds an index that is made anew when it is missing.\n";

std::uint64_t hashOf(std::string_view text) {
  std::uint64_t hash = 0xCBF29CE484222325;
  for (const char letter : text) hash = (hash ^ static_cast<unsigned char>(letter)) * 0x100000001B3;
  return hash;
}

bool isPlain(char letter) {
  return (letter >= 'a' && letter <= 'z') || (letter >= 'A' && letter <= 'Z') ||
         (letter >= '0' && letter <= '9') || letter == '-' || letter == '_';
}

// A root path as a file name. A long one ends in "~" and its hash; no short one contains that sign.
std::string fileNameOf(std::string_view root) {
  std::string name;
  std::array<char, 24> piece{};
  for (const char letter : root) {
    if (isPlain(letter)) {
      name += letter;
      continue;
    }
    std::snprintf(piece.data(), piece.size(), "%%%02X", static_cast<unsigned char>(letter));
    name += piece.data();
  }
  if (name.size() <= kLongestPlainName) return name;
  std::snprintf(piece.data(), piece.size(), "~%016llx", static_cast<unsigned long long>(hashOf(root)));
  return name.substr(0, kLongestPlainName) + piece.data();
}

Result<void> makeFolders(const std::string& path) {
  for (std::size_t end = path.find('/', 1);; end = path.find('/', end + 1)) {
    const std::string part = path.substr(0, end);
    if (::mkdir(part.c_str(), 0700) != 0 && errno != EEXIST) {
      const int code = errno;
      struct stat status {};
      if (::stat(part.c_str(), &status) != 0) return systemError(code);
    }
    if (end == std::string::npos) return {};
  }
}

Result<void> writeCacheTag(const std::string& path) {
  const FileDescriptor file(::open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC | O_NOFOLLOW, 0600));
  if (!file) {
    if (errno == EEXIST) return {};
    return systemError(errno);
  }
  if (::write(file.number(), kCacheTag.data(), kCacheTag.size()) == static_cast<ssize_t>(kCacheTag.size()))
    return {};
  const int code = errno;
  ::unlink(path.c_str());  // half a tag would stay for ever
  return systemError(code);
}

Result<void> syncPath(const std::string& path, int flags) {
  const FileDescriptor fd(::open(path.c_str(), flags | O_CLOEXEC));
  if (!fd || ::fsync(fd.number()) != 0) return systemError(errno);
  return {};
}

}  // namespace

std::string StoreFolder::storePath(std::string_view volumeRoot) const {
  return path() + "/" + fileNameOf(volumeRoot) + ".sqlite";
}

std::string StoreFolder::unfinishedPath(std::string_view volumeRoot) const {
  return storePath(volumeRoot) + ".unfinished";
}

std::string StoreFolder::lockPath(std::string_view volumeRoot) const {
  return storePath(volumeRoot) + ".lock";
}

Result<void> StoreFolder::prepare() const {
  if (auto made = makeFolders(path()); !made) return made;
  return writeCacheTag(cacheFolder_ + "/CACHEDIR.TAG");
}

Result<void> StoreFolder::publish(std::string_view volumeRoot) const {
  const std::string unfinished = unfinishedPath(volumeRoot);
  if (auto synced = syncPath(unfinished, O_RDONLY); !synced) return synced;
  if (::rename(unfinished.c_str(), storePath(volumeRoot).c_str()) != 0) return systemError(errno);
  return syncPath(path(), O_RDONLY | O_DIRECTORY);
}

Result<StoreLock> StoreLock::take(const std::string& lockPath, bool wait,
                                  const std::atomic<bool>& cancelled) {
  FileDescriptor fd(::open(lockPath.c_str(), O_RDWR | O_CREAT | O_CLOEXEC | O_NOFOLLOW, 0600));
  if (!fd) return systemError(errno);
  // Asked again and again: a blocked flock() could not be given up.
  while (::flock(fd.number(), LOCK_EX | LOCK_NB) != 0) {
    if (errno == EINTR) continue;
    if (errno != EWOULDBLOCK) return systemError(errno);
    if (!wait) return Error{EBUSY, "another update of this volume is under way"};
    if (cancelled.load(std::memory_order_relaxed)) return systemError(ECANCELED);
    std::this_thread::sleep_for(kLockRetry);
  }
  return StoreLock(std::move(fd));
}

std::string normalizedVolumeRoot(std::string_view root) {
  while (root.size() > 1 && root.back() == '/') root.remove_suffix(1);
  return std::string(root);
}

}  // namespace norvex
