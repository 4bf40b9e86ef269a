// The messages that the agent has reported, wherever they were recorded.
//
// Used by the commands, on the main thread.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "platform/Result.h"
#include "tool/AgentJournal.h"
#include "tool/Faults.h"

namespace norvex {

struct ReportedMessage {
  enum class Source { journal, file };

  std::int64_t time = 0;  // microseconds since 1970
  Source source = Source::journal;
  std::string domain;
  int level = 0;
  std::vector<std::pair<std::string, std::string>> pairs;  // in the order of the message
};

// A record that is no message: cut off by a crash, or changed by somebody.
struct DamagedRecord {
  std::string place;       // "the journal" or the file's path
  std::uint64_t line = 0;  // of a file, from 1; 0 for the journal
  std::string reason;
};

struct ReportedMessages {
  std::vector<ReportedMessage> messages;  // oldest first
  std::vector<DamagedRecord> damaged;
};

// The messages since the moment (seconds since 1970) from the journal and from the file of the diagnostic
// log, which need not be there. A journal or a file that cannot be read is a fault; the other is read all the
// same.
ReportedMessages reportedMessages(AgentJournal& journal, const std::string& file, std::int64_t since,
                                  Faults& faults);

// One message as the sinks of the diagnostic log record it; its time is 0 when it says none. Pure. The error
// says what is wrong with the text.
Result<ReportedMessage> parsedMessage(std::string_view json);

}  // namespace norvex
