#include "platform/linux/LinuxProcessControl.h"

#include <dirent.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <array>
#include <charconv>
#include <csignal>
#include <cstdlib>
#include <memory>
#include <set>
#include <string_view>

#include "platform/linux/IoPriority.h"

namespace norvex {
namespace {

constexpr std::array kEndingSignals = {SIGTERM, SIGINT, SIGHUP};
constexpr const char* kOwnThreads = "/proc/self/task";

// A thread that starts another one in the middle of a pass makes one more pass necessary. Each pass leaves
// fewer threads that could; the limit only keeps a process that starts threads without end from being looked
// at without end.
constexpr int kMostPasses = 64;

void setAction(void (*action)(int)) {
  struct sigaction disposition {};
  disposition.sa_handler = action;
  for (const int signal : kEndingSignals) ::sigaction(signal, &disposition, nullptr);
}

// The C library has no wrapper for this call. 0 is the calling thread.
void throttleThread(pid_t thread) {
  ::syscall(SYS_ioprio_set, kIoPriorityOfProcess, thread, ioPriority(kIoClassIdle));
}

// Throttles the threads that are not yet in `done`. False when there were none.
bool throttleNewThreads(std::set<pid_t>& done) {
  const auto close = [](DIR* folder) { ::closedir(folder); };
  const std::unique_ptr<DIR, decltype(close)> folder(::opendir(kOwnThreads), close);
  if (!folder) return false;
  bool anyNew = false;
  while (const dirent* entry = ::readdir(folder.get())) {
    const std::string_view name = entry->d_name;
    pid_t thread = 0;
    const auto [end, error] = std::from_chars(name.data(), name.data() + name.size(), thread);
    if (error != std::errc() || end != name.data() + name.size()) continue;
    if (!done.insert(thread).second) continue;
    throttleThread(thread);
    anyNew = true;
  }
  return anyNew;
}

}  // namespace

void LinuxProcessControl::allowSuddenTermination() {
  setAction(SIG_DFL);
  sigset_t signals;
  ::sigemptyset(&signals);
  for (const int signal : kEndingSignals) ::sigaddset(&signals, signal);
  ::pthread_sigmask(SIG_UNBLOCK, &signals, nullptr);
}

void LinuxProcessControl::disallowSuddenTermination() {
  setAction(SIG_IGN);
}

void LinuxProcessControl::throttleDiskIO() {
  throttleThread(0);
  std::set<pid_t> done;
  for (int pass = 0; pass < kMostPasses && throttleNewThreads(done); ++pass) {
  }
}

void LinuxProcessControl::exit(int status) {
  std::_Exit(status);
}

}  // namespace norvex
