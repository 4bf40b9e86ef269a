// The agent's entries in systemd's journal.
#pragma once

#include "tool/AgentJournal.h"

namespace norvex {

class SystemdAgentJournal final : public AgentJournal {
 public:
  // What other users' agents, or programs that only say that they are the agent, have written under another
  // user's id is not seen. At most the newest 100,000 entries are looked at.
  Result<std::vector<AgentJournalEntry>> entriesSince(std::int64_t moment) override;
};

}  // namespace norvex
