// A regular file that is open for reading at any offset.
//
// Owned by one object on one thread at a time; closed with it.
#pragma once

#include <optional>
#include <utility>

#include "platform/FileDescriptor.h"
#include "platform/linux/ByteSource.h"

namespace norvex {

class RegularFile final : public ByteSource {
 public:
  // `folder` and `path` as openat(2) has them. Nothing when there is no such file, when it may not be read,
  // and when it is anything but a regular file: links are not followed, and opening a FIFO or a device would
  // already be noticed at its other end. Never waits for anything but the disk. The file's time of last
  // access stays as it was where the kernel allows that, which is for the user's own files.
  static std::optional<RegularFile> openAt(int folder, const char* path);

  // The same of what has just been seen to be a regular file: it is opened without a further look. Should
  // something else have taken its place since, it is closed unread.
  static std::optional<RegularFile> openKnownAt(int folder, const char* path);

  // As of the opening.
  std::uint64_t size() const override { return size_; }
  std::size_t read(std::uint64_t offset, std::span<char> buffer) override;

 private:
  RegularFile(FileDescriptor file, std::uint64_t size) : file_(std::move(file)), size_(size) {}

  FileDescriptor file_;
  std::uint64_t size_;
};

}  // namespace norvex
