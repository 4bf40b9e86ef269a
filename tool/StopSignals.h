// Ctrl-C and its kin as a wish that long work looks at, so that it can end in good order.
//
// On the main thread.
#pragma once

#include <atomic>

namespace norvex {

// Set once the user wants to stop. For the life of the process.
const std::atomic<bool>& stopWanted();

// As long as the object lives, SIGINT, SIGTERM and SIGHUP are such a wish, and the second one of a kind ends
// the process at once, whatever it is doing. Before and afterwards the first one does. One at a time.
class StopSignals {
 public:
  StopSignals();
  ~StopSignals();
  StopSignals(const StopSignals&) = delete;
  StopSignals& operator=(const StopSignals&) = delete;
};

}  // namespace norvex
