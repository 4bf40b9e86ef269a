// A system log that keeps its lines, each as its level's number and its message: "3 Failed to ...".
//
// Any thread may call; read once no other thread logs any more.
#pragma once

#include <mutex>
#include <string>
#include <string_view>
#include <vector>

#include "platform/SystemLog.h"
#include "tests/support/CallJournal.h"

namespace norvex {

class InMemorySystemLog final : public SystemLog {
 public:
  explicit InMemorySystemLog(CallJournal& calls) : calls_(calls) {}

  void syslog(LogLevel level, std::string_view message) override {
    const std::string line = std::to_string(static_cast<int>(level)) + " " + std::string(message);
    calls_.add("syslog " + line);
    const std::lock_guard lock(mutex_);
    lines.push_back(line);
  }

  std::vector<std::string> lines;

 private:
  CallJournal& calls_;
  std::mutex mutex_;
};

}  // namespace norvex
