// A logging service for tests: a datagram socket that keeps what it is sent until it is asked.
#pragma once

#include <string>

#include "platform/FileDescriptor.h"

namespace norvex {

class LogListener {
 public:
  // Listens at `path`, which must be short enough for a socket.
  explicit LogListener(const std::string& path);

  // The oldest datagram that waits; the content of the memory that came in its place; "(nothing)" when none
  // waits.
  std::string next();

  // How the last message came.
  bool cameSealed() const { return cameSealed_; }

  // Sends to it until its queue is full: what a service looks like that is stopped.
  void fill(const std::string& path);

 private:
  FileDescriptor socket_;
  bool cameSealed_ = false;
};

}  // namespace norvex
