#include "ProcessStatus.h"

#include <sys/wait.h>

#include <cstdint>
#include <cstdlib>
#include <fstream>

namespace norvex {

std::string statusOf(pid_t process, std::string_view name) {
  std::ifstream status("/proc/" + std::to_string(process) + "/status");
  const std::string begin = std::string(name) + ":\t";
  for (std::string line; std::getline(status, line);) {
    if (line.starts_with(begin)) return line.substr(begin.size());
  }
  return "";
}

bool hasSignal(pid_t process, std::string_view set, int signal) {
  const std::uint64_t signals = std::strtoull(statusOf(process, set).c_str(), nullptr, 16);
  return (signals >> (signal - 1) & 1) != 0;
}

bool hasEnded(pid_t child) {
  siginfo_t end{};
  return ::waitid(P_PID, static_cast<id_t>(child), &end, WEXITED | WNOHANG | WNOWAIT) != 0 || end.si_pid != 0;
}

}  // namespace norvex
