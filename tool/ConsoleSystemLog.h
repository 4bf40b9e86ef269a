// The system log of a command that somebody runs at a terminal: its lines go to standard error.
#pragma once

#include <string>

#include "platform/SystemLog.h"
#include "tool/Console.h"
#include "tool/ExitStatus.h"
#include "tool/SafeText.h"

namespace norvex {

class ConsoleSystemLog final : public SystemLog {
 public:
  // `err` outlives this object. Used on the main thread alone.
  explicit ConsoleSystemLog(Console& err) : err_(err) {}

  void syslog(LogLevel level, std::string_view message) override {
    if (level == LogLevel::error) status_ = ExitStatus::failed;
    err_.tell(safeText(message));
  }

  // Whether an error has been told, such as settings that make no sense.
  ExitStatus status() const { return status_; }

 private:
  Console& err_;
  ExitStatus status_ = ExitStatus::success;
};

}  // namespace norvex
