// Ctrl-C and its kin as a wish that long work looks at, so that it can end in good order.
//
// Used by main, once.
#pragma once

#include <atomic>

namespace norvex {

// Set once the user wants to stop. For the life of the process.
const std::atomic<bool>& stopWanted();

// From now on SIGINT, SIGTERM and SIGHUP are such a wish. The second one of a kind ends the process at once,
// whatever it is doing.
void takeStopSignals();

}  // namespace norvex
