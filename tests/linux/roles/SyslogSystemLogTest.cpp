#include "platform/linux/SyslogSystemLog.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include "LogListener.h"
#include "ScratchFolder.h"

namespace norvex {
namespace {

using testing::EndsWith;
using testing::MatchesRegex;

// What arrives at the log when `message` is logged, with the process's id replaced by "PID".
std::string logged(LogLevel level, const std::string& message) {
  const ScratchFolder folder;
  LogListener listener(folder.at("log"));
  SyslogSystemLog(folder.at("log")).syslog(level, message);
  std::string datagram = listener.next();
  const std::string process = "[" + std::to_string(::getpid()) + "]";
  if (const std::size_t at = datagram.find(process); at != std::string::npos) {
    datagram.replace(at, process.size(), "[PID]");
  }
  return datagram;
}

TEST(SyslogSystemLog, SendsLevelIdentifierProcessAndMessage) {
  struct Case {
    LogLevel level;
    const char* pattern;
  };
  const Case cases[] = {
      {LogLevel::error, "<11>[A-Z][a-z][a-z] [ 1-3][0-9] ..:..:.. NorvexAgent\\[PID\\]: It failed."},
      {LogLevel::notice, "<13>[A-Z][a-z][a-z] [ 1-3][0-9] ..:..:.. NorvexAgent\\[PID\\]: It failed."},
  };
  for (const Case& row : cases) EXPECT_THAT(logged(row.level, "It failed."), MatchesRegex(row.pattern));
}

TEST(SyslogSystemLog, TakesNothingInTheMessageForAFormat) {
  const std::string message = "100%s %n %d%% file:///a%20b | \xff";
  EXPECT_THAT(logged(LogLevel::notice, message), EndsWith("NorvexAgent[PID]: " + message));
}

TEST(SyslogSystemLog, AMessageEndsAtItsFirstZeroByte) {
  EXPECT_THAT(logged(LogLevel::notice, std::string("seen\0unseen", 11)), EndsWith("[PID]: seen"));
}

TEST(SyslogSystemLog, WithoutALogMessagesVanish) {
  const ScratchFolder folder;
  SyslogSystemLog(folder.at("none")).syslog(LogLevel::error, "Nobody listens.");
  EXPECT_TRUE(std::filesystem::is_empty(folder.path()));
}

TEST(SyslogSystemLog, ALogThatIsStoppedHoldsNobodyUp) {
  const ScratchFolder folder;
  LogListener listener(folder.at("log"));
  listener.fill(folder.at("log"));
  SyslogSystemLog log(folder.at("log"), std::chrono::milliseconds(50));
  log.syslog(LogLevel::error, "lost");  // returns
  while (listener.next() != "(nothing)") {
  }
  log.syslog(LogLevel::error, "arrives");
  EXPECT_THAT(listener.next(), EndsWith("arrives"));
}

}  // namespace
}  // namespace norvex
