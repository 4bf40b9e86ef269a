// One open file descriptor, closed with the object.
//
// Used by the Linux roles, on any thread. Can be moved, not copied.
#pragma once

#include <unistd.h>

#include <utility>

namespace norvex {

class FileHandle {
 public:
  FileHandle() = default;
  // Takes the descriptor over; a negative one stands for "none".
  explicit FileHandle(int descriptor) : descriptor_(descriptor) {}
  FileHandle(FileHandle&& other) noexcept : descriptor_(std::exchange(other.descriptor_, -1)) {}
  FileHandle& operator=(FileHandle&& other) noexcept {
    if (this != &other) {
      close();
      descriptor_ = std::exchange(other.descriptor_, -1);
    }
    return *this;
  }
  ~FileHandle() { close(); }

  explicit operator bool() const { return descriptor_ >= 0; }
  int get() const { return descriptor_; }

 private:
  void close() {
    if (descriptor_ >= 0) ::close(descriptor_);
  }

  int descriptor_ = -1;
};

}  // namespace norvex
