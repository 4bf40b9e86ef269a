// One look at how a role of the agent is played on this machine: what it is given, and what it finds.
//
// On the main thread, with the machine's roles installed.
#pragma once

#include <string>
#include <vector>

#include "platform/linux/JournalDiagnosticLog.h"
#include "platform/linux/SyslogSystemLog.h"
#include "tool/ToolWorld.h"

namespace norvex {

struct Finding {
  enum class State {
    works,
    fallsBack,  // the agent goes on with something that is not as good
    broken,     // the agent cannot do its work
  };

  std::string role;
  State state = State::works;
  std::string text;    // what was found; for people, and safe to be shown
  std::string remedy;  // what to do; empty where there is nothing to do
};

// Where the machine keeps what is looked at.
struct DoctorPlaces {
  std::string journalSocket = kJournalSocket;
  std::string systemLogSocket = kSystemLogSocket;
  std::vector<std::string> pressureFiles;  // of memory, best first
  std::string preferenceFolder;            // need not exist yet
  std::string temporaryFolder;             // for a file to try the reader of media files on
  std::string numbersLocale;               // the name of the locale that numbers are written in

  static DoctorPlaces ofThisMachine();
};

// What the looks have in common.
struct Examined {
  const ToolWorld& world;
  const DoctorPlaces& places;
};

}  // namespace norvex
