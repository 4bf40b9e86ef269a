// An open file descriptor that is closed when its owner goes.
//
// For whatever speaks with the kernel itself. Owned by one object, on one thread at a time.
#pragma once

#include <unistd.h>

#include <utility>

namespace norvex {

class FileDescriptor {
 public:
  FileDescriptor() = default;
  // Takes over what a system call returned; a negative number is no descriptor.
  explicit FileDescriptor(int number) : number_(number) {}
  FileDescriptor(FileDescriptor&& other) noexcept : number_(std::exchange(other.number_, -1)) {}
  FileDescriptor& operator=(FileDescriptor&& other) noexcept {
    std::swap(number_, other.number_);
    return *this;
  }
  FileDescriptor(const FileDescriptor&) = delete;
  FileDescriptor& operator=(const FileDescriptor&) = delete;
  ~FileDescriptor() {
    if (number_ >= 0) ::close(number_);
  }

  int number() const { return number_; }
  explicit operator bool() const { return number_ >= 0; }

 private:
  int number_ = -1;
};

}  // namespace norvex
