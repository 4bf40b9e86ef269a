// The process's own signals, its disk priority, its command line and its end.
//
// Sudden termination is what SIGTERM, SIGINT and SIGHUP do: allowed, they have their default action, so that
// whoever asked sees a process that was ended by that signal; disallowed, they are ignored by the whole
// process.
#pragma once

#include "platform/ProcessControl.h"

namespace norvex {

class LinuxProcessControl final : public ProcessControl {
 public:
  // The command line, the program's own name first.
  explicit LinuxProcessControl(std::vector<std::string> arguments) : arguments_(std::move(arguments)) {}

  const std::vector<std::string>& arguments() const override { return arguments_; }

  // Also lets the three signals through to the calling thread, should whoever started the process have
  // blocked them.
  void allowSuddenTermination() override;
  void disallowSuddenTermination() override;

  // Puts every thread that there is into the idle I/O class, the calling one first. The class is inherited by
  // the threads that they start later.
  void throttleDiskIO() override;

  // Without running static destructors or exit handlers: the main thread and background threads are still at
  // work and would find their objects gone. Buffers of the C library's streams are not written; the agent
  // leaves nothing in them.
  [[noreturn]] void exit(int status) override;

 private:
  std::vector<std::string> arguments_;
};

}  // namespace norvex
