// The system log, spoken to as syslog(3) does, but never waited for without a limit: identifier
// "NorvexAgent", facility user, with the process id.
#pragma once

#include <string>

#include "platform/SystemLog.h"
#include "platform/linux/LogSocket.h"

namespace norvex {

// Where the system log listens.
inline constexpr const char* kSystemLogSocket = "/dev/log";

class SyslogSystemLog final : public SystemLog {
 public:
  explicit SyslogSystemLog(const std::string& socketPath = kSystemLogSocket,
                           std::chrono::milliseconds sendLimit = LogSocket::kSendLimit)
      : socket_(socketPath, sendLimit) {}

  // A message ends at its first zero byte, if it has one. Where there is no log, and while the log is stopped
  // and its queue full, messages vanish; the first of them waits for the limit.
  void syslog(LogLevel level, std::string_view message) override;

 private:
  LogSocket socket_;
};

}  // namespace norvex
