#include "platform/linux/SyslogSystemLog.h"

#include <syslog.h>

#include <string>

namespace norvex {
namespace {
// The C library keeps the pointer, not the text.
constexpr const char* kIdentifier = "NorvexAgent";

static_assert(static_cast<int>(LogLevel::error) == LOG_ERR);
static_assert(static_cast<int>(LogLevel::notice) == LOG_NOTICE);
}  // namespace

SyslogSystemLog::SyslogSystemLog() {
  ::openlog(kIdentifier, LOG_PID, LOG_USER);
}

void SyslogSystemLog::syslog(LogLevel level, std::string_view message) {
  ::syslog(static_cast<int>(level), "%s", std::string(message).c_str());
}

}  // namespace norvex
