#include "tool/StopSignals.h"

#include <signal.h>

namespace norvex {
namespace {

std::atomic<bool> wanted{false};
static_assert(std::atomic<bool>::is_always_lock_free, "a signal handler may set nothing else");

constexpr int kSignals[] = {SIGINT, SIGTERM, SIGHUP};

void noteStop(int) {
  wanted.store(true);
}

// What was ignored when the program started stays so: `nohup` means it.
void setUnlessIgnored(int signal, void (*handler)(int), int flags) {
  struct sigaction before {};
  ::sigaction(signal, nullptr, &before);
  if (before.sa_handler == SIG_IGN) return;
  struct sigaction action {};
  action.sa_handler = handler;
  action.sa_flags = flags;
  ::sigaction(signal, &action, nullptr);
}

}  // namespace

const std::atomic<bool>& stopWanted() {
  return wanted;
}

StopSignals::StopSignals() {
  for (const int signal : kSignals)
    setUnlessIgnored(signal, noteStop, static_cast<int>(SA_RESETHAND | SA_RESTART));
}

StopSignals::~StopSignals() {
  for (const int signal : kSignals) setUnlessIgnored(signal, SIG_DFL, 0);
}

}  // namespace norvex
