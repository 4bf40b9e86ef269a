// The system log by way of syslog(3): identifier "NorvexAgent", facility user, with the process id.
#pragma once

#include "platform/SystemLog.h"

namespace norvex {

class SyslogSystemLog final : public SystemLog {
 public:
  // Sets the identifier for the whole process. The log is reached for at the first message only; where there
  // is none, messages vanish.
  SyslogSystemLog();

  // A message ends at its first zero byte, if it has one.
  void syslog(LogLevel level, std::string_view message) override;
};

}  // namespace norvex
