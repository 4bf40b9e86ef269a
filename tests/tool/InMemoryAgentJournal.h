// A journal whose entries a test writes down, oldest first.
#pragma once

#include <optional>
#include <utility>
#include <vector>

#include "tool/AgentJournal.h"

namespace norvex {

class InMemoryAgentJournal final : public AgentJournal {
 public:
  Result<std::vector<AgentJournalEntry>> entriesSince(std::int64_t moment) override {
    if (failure) return *failure;
    std::vector<AgentJournalEntry> some;
    for (const AgentJournalEntry& entry : entries) {
      if (entry.time >= moment * 1'000'000) some.push_back(entry);
    }
    return some;
  }

  std::vector<AgentJournalEntry> entries;
  std::optional<Error> failure;
};

}  // namespace norvex
