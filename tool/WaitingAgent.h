// An agent that somebody has started by hand, and that waits for the word to run.
//
// On the main thread.
#pragma once

#include <sys/types.h>

#include <optional>

namespace norvex {

// Sends the run signal to this user's agent that waits for it, and returns its process id. Absent when there
// is none. A process of that name which would not outlive the signal is left alone, and so is an agent that
// runs by force.
std::optional<pid_t> wakeWaitingAgent();

}  // namespace norvex
