// What the agent has written into the system's journal.
//
// Asked by the commands, on the main thread.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "platform/Result.h"

namespace norvex {

struct AgentJournalEntry {
  std::int64_t time = 0;      // microseconds since 1970
  int priority = 0;           // as of syslog; 3 is an error
  std::string text;           // any bytes; of a diagnostic message its JSON
  bool isDiagnostic = false;  // a message of the diagnostic log, not a line of the system log
};

class AgentJournal {
 public:
  virtual ~AgentJournal() = default;

  // The entries of this user's agent from this moment on (seconds since 1970), oldest first. None is no
  // failure, nor is a machine that keeps no journal. Fails when there is a journal and it cannot be read.
  virtual Result<std::vector<AgentJournalEntry>> entriesSince(std::int64_t moment) = 0;
};

}  // namespace norvex
