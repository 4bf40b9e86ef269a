// What the agent goes by: its name, its argument, and the mark of a release that has reported.
//
// Used by the entry, and by the companion command, which tells people what became of the agent.
#pragma once

#include <cstdint>

namespace norvex {

// One name for the scheduler's activity, the service manager's job and the domain of the preferences.
inline constexpr const char* agentLabel = "com.brixo.NorvexAgent";

// With this argument it reports at once and waits for nothing.
inline constexpr const char* forceArgument = "--force";

// The preference that holds the run version of the last run that reported.
inline constexpr const char* lastVersionRunKey = "LastVersionRun";

// Raised by each release that is to report anew.
inline constexpr std::int64_t currentRunVersion = 4;

}  // namespace norvex
