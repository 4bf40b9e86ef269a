#include "platform/linux/FileReplacement.h"

#include <dirent.h>
#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <cstdio>
#include <memory>
#include <utility>

#include "platform/linux/Files.h"

namespace norvex {
namespace {

constexpr mode_t kPrivateFileMode = 0600;

// Another writer needs milliseconds. Whoever holds the lock for longer is stopped, and must not stop us.
constexpr std::chrono::milliseconds kLockLimit{2000};

// Makes the file at `path`, which is not there yet, and brings it to the disk.
int writeNewFile(const std::string& path, std::string_view text) {
  const FileDescriptor file(
      ::open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC | O_NOFOLLOW, kPrivateFileMode));
  if (!file) return errno;
  if (const int error = writeAll(file.number(), text)) return error;
  return ::fsync(file.number()) == 0 ? 0 : errno;
}

int renameFile(const std::string& from, const std::string& to) {
  return std::rename(from.c_str(), to.c_str()) == 0 ? 0 : errno;
}

}  // namespace

FileReplacement::FileReplacement(std::string path) : path_(std::move(path)) {
  const std::size_t nameStart = path_.find_last_of('/') + 1;  // 0 when there is no separator
  folderPath_ = nameStart == 0 ? "./" : path_.substr(0, nameStart);
  unfinishedPrefix_ = "." + path_.substr(nameStart) + ".unfinished-";
  folder_ = FileDescriptor(::open(folderPath_.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
  if (folder_ && lockWithin(folder_.number(), kLockLimit)) removeUnfinished();
}

// Only with the folder locked: whatever unfinished file there is then belongs to a process that has died.
void FileReplacement::removeUnfinished() const {
  const auto close = [](DIR* folder) { ::closedir(folder); };
  const std::unique_ptr<DIR, decltype(close)> folder(::opendir(folderPath_.c_str()), close);
  if (!folder) return;
  while (const dirent* entry = ::readdir(folder.get())) {
    const std::string_view name = entry->d_name;
    if (name.starts_with(unfinishedPrefix_)) ::unlinkat(folder_.number(), entry->d_name, 0);
  }
}

int FileReplacement::commit(std::string_view text, const std::string& keptAs) {
  if (!folder_) return EACCES;
  // The process id keeps writers apart that could not lock each other out; one of that name is our own.
  const std::string unfinished = folderPath_ + unfinishedPrefix_ + std::to_string(::getpid());
  ::unlink(unfinished.c_str());
  int error = writeNewFile(unfinished, text);
  if (error == 0) error = exchange(unfinished, keptAs);
  if (error != 0) {
    ::unlink(unfinished.c_str());
    return error;
  }
  return ::fsync(folder_.number()) == 0 ? 0 : errno;
}

// Moves the old file away, when that is asked for, and the new one into its place.
int FileReplacement::exchange(const std::string& unfinished, const std::string& keptAs) const {
  if (keptAs.empty()) return renameFile(unfinished, path_);
  const int keptError = renameFile(path_, keptAs);
  if (keptError != 0 && keptError != ENOENT) return keptError;
  const int error = renameFile(unfinished, path_);
  if (error != 0 && keptError == 0) renameFile(keptAs, path_);
  return error;
}

}  // namespace norvex
