// Diagnostic messages as entries of the system's journal.
#pragma once

#include <string>

#include "platform/DiagnosticLog.h"
#include "platform/linux/LogSocket.h"

namespace norvex {

// Where the journal listens.
inline constexpr const char* kJournalSocket = "/run/systemd/journal/socket";

class JournalDiagnosticLog final : public DiagnosticLog {
 public:
  // `unit` is the service that the process runs as, empty when it runs as none: the journal then finds its
  // entries also when the process ended before the journal could look at it. `withoutJournal` outlives this.
  JournalDiagnosticLog(std::string unit, DiagnosticLog& withoutJournal,
                       const std::string& socketPath = kJournalSocket,
                       std::chrono::milliseconds sendLimit = LogSocket::kSendLimit)
      : unit_(std::move(unit)), withoutJournal_(withoutJournal), socket_(socketPath, sendLimit) {}

  // One entry: MESSAGE_ID (see DiagnosticMessageIds.h), PRIORITY, SYSLOG_IDENTIFIER, USER_UNIT,
  // NORVEX_DOMAIN, NORVEX_LEVEL, the pairs as NORVEX_PAIR_01=key=value and so on, the number being the order,
  // and as MESSAGE the whole as JSON. Where no journal listens, or its queue stays full for the limit,
  // `withoutJournal` takes the message: it is recorded in one of the two, and never in both.
  void logWithKeys(std::string_view domain, int level, std::span<const DiagnosticPair> pairs) override;

 private:
  bool isRecorded(const std::string& entry);

  std::string unit_;
  DiagnosticLog& withoutJournal_;
  LogSocket socket_;
};

}  // namespace norvex
