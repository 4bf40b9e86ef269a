// What the commands of the companion command work with: where they write, and what they know of the machine.
//
// Made by main, or by a test; everything that it refers to outlives it. Used on the main thread.
#pragma once

#include <atomic>
#include <cstdint>
#include <functional>
#include <string>

#include "index/StoreFolder.h"
#include "platform/BackupSettings.h"
#include "platform/ByteCountFormatter.h"
#include "platform/Clock.h"
#include "tool/AgentJob.h"
#include "tool/AgentJournal.h"
#include "tool/Console.h"
#include "tool/FigureText.h"

namespace norvex {

struct ToolWorld {
  Console& out;
  Console& err;

  const StoreFolder& stores;
  BackupSettings& backupSettings;
  const ByteCountFormatter& byteCounts;
  DigitsText digits;   // of counts
  const Clock& clock;  // for elapsed times

  std::function<std::int64_t()> secondsSince1970;                // the present moment, for people
  std::function<bool(const std::string& path)> isMountPoint;     // whether another volume begins there
  std::function<std::string(const std::string& path)> absolute;  // of a path as it was written

  std::string dataHome;      // the user's data folder
  std::string messagesFile;  // of the diagnostic log, for when there is no journal
  std::string disabledFile;  // an administrator's word against every report
  AgentJournal& agentJournal;
  AgentJob& agentJob;
  std::function<bool()> wakeWaitingAgent;  // false when there is none

  // Set once the user wants to stop; read by what may take long.
  const std::atomic<bool>& cancelled;
};

}  // namespace norvex
