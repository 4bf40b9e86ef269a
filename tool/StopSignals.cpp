#include "tool/StopSignals.h"

#include <signal.h>

namespace norvex {
namespace {

std::atomic<bool> wanted{false};
static_assert(std::atomic<bool>::is_always_lock_free, "a signal handler may set nothing else");

void noteStop(int) {
  wanted.store(true);
}

}  // namespace

const std::atomic<bool>& stopWanted() {
  return wanted;
}

void takeStopSignals() {
  struct sigaction action {};
  action.sa_handler = noteStop;
  action.sa_flags = static_cast<int>(SA_RESETHAND | SA_RESTART);
  for (const int signal : {SIGINT, SIGTERM, SIGHUP}) {
    // What was ignored when the program started stays so: `nohup` means it.
    struct sigaction before {};
    ::sigaction(signal, nullptr, &before);
    if (before.sa_handler != SIG_IGN) ::sigaction(signal, &action, nullptr);
  }
}

}  // namespace norvex
