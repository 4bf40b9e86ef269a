#include "platform/linux/SyslogSystemLog.h"

#include <syslog.h>
#include <unistd.h>

#include <array>
#include <cstdio>
#include <ctime>

#include "platform/linux/LogIdentifier.h"

namespace norvex {
namespace {

static_assert(static_cast<int>(LogLevel::error) == LOG_ERR);
static_assert(static_cast<int>(LogLevel::notice) == LOG_NOTICE);

// English in every locale: the log takes the line apart.
constexpr std::array<const char*, 12> kMonths = {"Jan", "Feb", "Mar", "Apr", "May", "Jun",
                                                 "Jul", "Aug", "Sep", "Oct", "Nov", "Dec"};

// "<13>Jan  2 03:04:05 NorvexAgent[123]: ", local time, as the log expects it.
std::string prefixOf(LogLevel level) {
  const std::time_t now = std::time(nullptr);
  std::tm local{};
  ::localtime_r(&now, &local);
  std::array<char, 64> text{};
  std::snprintf(text.data(), text.size(), "<%d>%s %2d %02d:%02d:%02d ", LOG_USER | static_cast<int>(level),
                kMonths.at(static_cast<std::size_t>(local.tm_mon)), local.tm_mday, local.tm_hour,
                local.tm_min, local.tm_sec);
  return std::string(text.data()) + kLogIdentifier + '[' + std::to_string(::getpid()) + "]: ";
}

}  // namespace

void SyslogSystemLog::syslog(LogLevel level, std::string_view message) {
  socket_.send(prefixOf(level).append(message.substr(0, message.find('\0'))));
}

}  // namespace norvex
