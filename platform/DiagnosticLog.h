// The system's diagnostic message log, the one place where the agent reports figures.
//
// Called on the thread of the run, once a message.
#pragma once

#include <span>
#include <string>
#include <string_view>

namespace norvex {

struct DiagnosticPair {
  std::string key;
  std::string value;
};

class DiagnosticLog {
 public:
  virtual ~DiagnosticLog() = default;

  // Records one message: its domain, its level (as of syslog, 5 = notice) and all its pairs in the order
  // given. Returns when it is recorded, or when recording it has failed for good; never fails towards the
  // caller.
  virtual void logWithKeys(std::string_view domain, int level, std::span<const DiagnosticPair> pairs) = 0;
};

}  // namespace norvex
