// The system log, for the people who look after the machine.
//
// Called from any thread.
#pragma once

#include <string_view>

namespace norvex {

// The levels that the agent uses, with the numbers that syslog gives them.
enum class LogLevel : int { error = 3, notice = 5 };

class SystemLog {
 public:
  virtual ~SystemLog() = default;

  // Writes the message as it stands; nothing in it is taken for a format. Cannot fail towards the caller.
  virtual void syslog(LogLevel level, std::string_view message) = 0;
};

}  // namespace norvex
