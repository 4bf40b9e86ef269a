#include "scanner/DebugLevel.h"

#include <string>

#include "platform/Platform.h"

namespace norvex {

std::int64_t debugLevel = 0;

void logDebugLine(std::string_view message, std::string_view sourceName, int line) {
  if (debugLevel <= 0) return;
  std::string text(message);
  text += " | ";
  text += sourceName;
  text += ':';
  text += std::to_string(line);
  platform().systemLog.syslog(LogLevel::notice, text);
}

}  // namespace norvex
