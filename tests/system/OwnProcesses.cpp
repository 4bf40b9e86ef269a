#include "OwnProcesses.h"

#include <fcntl.h>
#include <sched.h>
#include <sys/mount.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <stdexcept>
#include <system_error>

#include "AgentWorld.h"

namespace norvex {
namespace {

[[noreturn]] void waitToBeKilled() {
  ::prctl(PR_SET_PDEATHSIG, SIGKILL);
  for (;;) ::pause();
}

bool procCanBeShown() {
  const pid_t process = ::fork();
  if (process == 0) ::_exit(OwnProcesses::showInProc() ? 0 : 1);
  return AgentWorld::wait(process) == 0;
}

}  // namespace

OwnProcesses::OwnProcesses() : outside_(::open("/proc/self/ns/pid", O_RDONLY | O_CLOEXEC)) {
  if (!outside_ || ::unshare(CLONE_NEWPID) != 0) {
    obstacle_ = "a process namespace of one's own: " + std::generic_category().message(errno);
    return;
  }
  first_ = ::fork();
  if (first_ < 0) throw std::runtime_error("no process");
  if (first_ == 0) waitToBeKilled();
  if (!procCanBeShown()) obstacle_ = "mounting /proc of a process namespace of one's own is not allowed here";
}

OwnProcesses::~OwnProcesses() {
  if (first_ < 0) return;
  ::kill(first_, SIGKILL);
  // The first does not end before the others have been waited for.
  while (::waitpid(-1, nullptr, 0) > 0 || errno == EINTR) {
  }
  ::setns(outside_.number(), CLONE_NEWPID);
}

bool OwnProcesses::showInProc() {
  return ::unshare(CLONE_NEWNS) == 0 && ::mount("", "/", nullptr, MS_REC | MS_PRIVATE, nullptr) == 0 &&
         ::mount("proc", "/proc", "proc", 0, nullptr) == 0;
}

}  // namespace norvex
