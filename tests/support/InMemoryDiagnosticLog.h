// A diagnostic log that keeps its messages as they came.
#pragma once

#include <functional>
#include <span>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "platform/DiagnosticLog.h"
#include "tests/support/CallJournal.h"

namespace norvex {

class InMemoryDiagnosticLog final : public DiagnosticLog {
 public:
  struct Message {
    std::string domain;
    int level;
    std::vector<std::pair<std::string, std::string>> pairs;
  };

  explicit InMemoryDiagnosticLog(CallJournal& calls) : calls_(calls) {}

  void logWithKeys(std::string_view domain, int level, std::span<const DiagnosticPair> pairs) override {
    calls_.add("logWithKeys " + std::string(domain));
    if (whenLogging) whenLogging();
    Message message{std::string(domain), level, {}};
    for (const DiagnosticPair& pair : pairs) message.pairs.emplace_back(pair.key, pair.value);
    messages.push_back(std::move(message));
  }

  std::vector<Message> messages;
  // Called before a message is kept.
  std::function<void()> whenLogging;

 private:
  CallJournal& calls_;
};

}  // namespace norvex
