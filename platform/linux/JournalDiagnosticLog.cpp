#include "platform/linux/JournalDiagnosticLog.h"

#include <cerrno>

#include "platform/linux/DiagnosticMessageIds.h"
#include "platform/linux/DiagnosticMessageText.h"
#include "platform/linux/JournalEntry.h"
#include "platform/linux/LogIdentifier.h"

namespace norvex {
namespace {

// From 01 on: with two digits the names of one message's pairs also sort in their order.
std::string pairName(std::size_t index) {
  const std::string number = std::to_string(index + 1);
  return "NORVEX_PAIR_" + std::string(number.size() < 2 ? 1 : 0, '0') + number;
}

}  // namespace

void JournalDiagnosticLog::logWithKeys(std::string_view domain, int level,
                                       std::span<const DiagnosticPair> pairs) {
  JournalEntry entry;
  if (const std::string_view id = diagnosticMessageId(domain); !id.empty()) entry.add("MESSAGE_ID", id);
  entry.add("PRIORITY", std::to_string(level));
  entry.add("SYSLOG_IDENTIFIER", kLogIdentifier);
  if (!unit_.empty()) entry.add("USER_UNIT", unit_);
  entry.add("NORVEX_DOMAIN", domain);
  entry.add("NORVEX_LEVEL", std::to_string(level));
  for (std::size_t index = 0; index < pairs.size(); ++index) {
    entry.add(pairName(index), pairs[index].key + '=' + pairs[index].value);
  }
  entry.add("MESSAGE", diagnosticMessageJson(domain, level, pairs));
  if (!isRecorded(entry.bytes())) withoutJournal_.logWithKeys(domain, level, pairs);
}

bool JournalDiagnosticLog::isRecorded(const std::string& entry) {
  const int error = socket_.send(entry);
  if (error == EMSGSIZE || error == ENOBUFS) return socket_.sendSealed(entry) == 0;
  return error == 0;
}

}  // namespace norvex
