// Processes of a test's own: while the object lives, the processes that its thread starts are in a namespace
// with nobody else's, so that a program which looks for a process finds those of this test alone. The test
// itself stays outside, and sees and waits for them as for any child. Meanwhile it can start no thread.
#pragma once

#include <sys/types.h>

#include <string>

#include "platform/FileDescriptor.h"

namespace norvex {

class OwnProcesses {
 public:
  OwnProcesses();

  // Ends all of them. Waits for every child that the test has left.
  ~OwnProcesses();

  OwnProcesses(const OwnProcesses&) = delete;
  OwnProcesses& operator=(const OwnProcesses&) = delete;

  // Why there is no such namespace here; empty when there is one.
  const std::string& obstacle() const { return obstacle_; }

  // For a process among them: from now on /proc shows it these alone. False where that is not allowed.
  static bool showInProc();

 private:
  FileDescriptor outside_;  // the namespace of the test
  pid_t first_ = -1;        // the namespace lasts as long as its first process
  std::string obstacle_;
};

}  // namespace norvex
