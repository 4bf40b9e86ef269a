#include "tool/SystemdAgentJournal.h"

#include <systemd/sd-journal.h>
#include <unistd.h>

#include <algorithm>
#include <charconv>
#include <memory>
#include <optional>
#include <string_view>

namespace norvex {
namespace {

constexpr std::size_t kMostEntries = 100'000;
constexpr std::int64_t kMicroseconds = 1'000'000;

struct CloseJournal {
  void operator()(sd_journal* journal) const { ::sd_journal_close(journal); }
};
using Journal = std::unique_ptr<sd_journal, CloseJournal>;

Error journalError(int negativeErrno) {
  const Error error = systemError(-negativeErrno);
  return {error.code, "the journal cannot be read: " + error.description};
}

Result<Journal> openJournal() {
  sd_journal* opened = nullptr;
  if (const int status = ::sd_journal_open(&opened, SD_JOURNAL_LOCAL_ONLY); status < 0)
    return journalError(status);
  Journal journal(opened);
  // The identifier is anybody's to use; the user's id is the kernel's word.
  for (const std::string& match :
       {std::string("SYSLOG_IDENTIFIER=NorvexAgent"), "_UID=" + std::to_string(::getuid())}) {
    if (const int status = ::sd_journal_add_match(opened, match.data(), match.size()); status < 0)
      return journalError(status);
  }
  // The library otherwise cuts long values.
  ::sd_journal_set_data_threshold(opened, 0);
  return journal;
}

// The value of a field of the present entry; absent when it has none.
std::optional<std::string> field(sd_journal* journal, std::string_view name) {
  const void* data = nullptr;
  std::size_t length = 0;
  if (::sd_journal_get_data(journal, std::string(name).c_str(), &data, &length) < 0) return std::nullopt;
  // "NAME=value"
  std::string_view text(static_cast<const char*>(data), length);
  text.remove_prefix(std::min(text.size(), name.size() + 1));
  return std::string(text);
}

AgentJournalEntry presentEntry(sd_journal* journal) {
  AgentJournalEntry entry;
  std::uint64_t time = 0;
  if (::sd_journal_get_realtime_usec(journal, &time) >= 0) entry.time = static_cast<std::int64_t>(time);
  const std::string priority = field(journal, "PRIORITY").value_or("");
  std::from_chars(priority.data(), priority.data() + priority.size(), entry.priority);
  entry.text = field(journal, "MESSAGE").value_or("");
  entry.isDiagnostic = field(journal, "NORVEX_DOMAIN").has_value();
  return entry;
}

}  // namespace

Result<std::vector<AgentJournalEntry>> SystemdAgentJournal::entriesSince(std::int64_t moment) {
  auto opened = openJournal();
  if (!opened) return opened.error();
  sd_journal* journal = opened.value().get();
  std::vector<AgentJournalEntry> entries;
  // From the newest backwards, so that what is asked for is there however much came before.
  ::sd_journal_seek_tail(journal);
  int status = 0;
  while (entries.size() < kMostEntries && (status = ::sd_journal_previous(journal)) > 0) {
    AgentJournalEntry entry = presentEntry(journal);
    if (entry.time < moment * kMicroseconds) break;
    entries.push_back(std::move(entry));
  }
  if (status < 0) return journalError(status);
  std::reverse(entries.begin(), entries.end());
  return entries;
}

}  // namespace norvex
