// A process whose end is an exception, so that a test survives it.
//
// exit() may be called from any thread whose top catches ProcessExited.
#pragma once

#include <string>
#include <vector>

#include "platform/ProcessControl.h"
#include "tests/support/CallJournal.h"

namespace norvex {

// Thrown in place of the end of the process.
struct ProcessExited {
  int status;
};

class InMemoryProcessControl final : public ProcessControl {
 public:
  explicit InMemoryProcessControl(CallJournal& calls) : calls_(calls) {}

  const std::vector<std::string>& arguments() const override { return commandLine; }
  void allowSuddenTermination() override { calls_.add("allowSuddenTermination"); }
  void disallowSuddenTermination() override { calls_.add("disallowSuddenTermination"); }
  void throttleDiskIO() override { calls_.add("throttleDiskIO"); }
  [[noreturn]] void exit(int status) override {
    calls_.add("exit " + std::to_string(status));
    throw ProcessExited{status};
  }

  std::vector<std::string> commandLine = {"NorvexAgent"};

 private:
  CallJournal& calls_;
};

}  // namespace norvex
