#include "platform/linux/SyslogSystemLog.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/mount.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

#include <cstring>

#include "ChildProcess.h"
#include "platform/FileDescriptor.h"

namespace norvex {
namespace {

using testing::MatchesRegex;

// The log's socket, where the C library expects it. For a child with mounts of its own.
FileDescriptor listenAtDevLog() {
  FileDescriptor listener(::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0));
  sockaddr_un address{};
  address.sun_family = AF_UNIX;
  std::strcpy(address.sun_path, "/dev/log");
  if (::bind(listener.number(), reinterpret_cast<const sockaddr*>(&address), sizeof(address)) != 0) return {};
  return listener;
}

std::string nextDatagram(const FileDescriptor& listener) {
  char buffer[4096];
  const ssize_t count = ::recv(listener.number(), buffer, sizeof(buffer), MSG_DONTWAIT);
  return count < 0 ? "(nothing)" : std::string(buffer, static_cast<std::size_t>(count));
}

// What arrives at the log when `message` is logged, with the child's process id replaced by "PID".
ChildEnd logged(LogLevel level, const std::string& message) {
  return inChild([&]() -> std::string {
    if (const std::string problem = mountSmallDisk("/dev", "64k"); !problem.empty()) return problem;
    const FileDescriptor listener = listenAtDevLog();
    if (!listener) return "no socket";
    SyslogSystemLog log;
    log.syslog(level, message);
    std::string datagram = nextDatagram(listener);
    const std::string process = "[" + std::to_string(::getpid()) + "]";
    if (const std::size_t at = datagram.find(process); at != std::string::npos) {
      datagram.replace(at, process.size(), "[PID]");
    }
    return datagram;
  });
}

TEST(SyslogSystemLog, SendsLevelIdentifierProcessAndMessage) {
  struct Case {
    LogLevel level;
    const char* pattern;
  };
  const Case cases[] = {
      {LogLevel::error, "<11>[A-Z][a-z][a-z] .[0-9] ..:..:.. NorvexAgent\\[PID\\]: It failed."},
      {LogLevel::notice, "<13>[A-Z][a-z][a-z] .[0-9] ..:..:.. NorvexAgent\\[PID\\]: It failed."},
  };
  for (const Case& row : cases) {
    const ChildEnd end = logged(row.level, "It failed.");
    NORVEX_SKIP_IF_IMPOSSIBLE(end);
    EXPECT_THAT(end.report, MatchesRegex(row.pattern));
  }
}

TEST(SyslogSystemLog, TakesNothingInTheMessageForAFormat) {
  const std::string message = "100%s %n %d%% file:///a%20b | \xff";
  const ChildEnd end = logged(LogLevel::notice, message);
  NORVEX_SKIP_IF_IMPOSSIBLE(end);
  EXPECT_THAT(end.report, testing::EndsWith("NorvexAgent[PID]: " + message));
}

TEST(SyslogSystemLog, WithoutALogMessagesVanish) {
  const ChildEnd end = inChild([]() -> std::string {
    if (const std::string problem = mountSmallDisk("/dev", "64k"); !problem.empty()) return problem;
    SyslogSystemLog log;
    log.syslog(LogLevel::error, "Nobody listens.");
    return "went on";
  });
  NORVEX_SKIP_IF_IMPOSSIBLE(end);
  EXPECT_EQ(end.report, "went on");
}

}  // namespace
}  // namespace norvex
