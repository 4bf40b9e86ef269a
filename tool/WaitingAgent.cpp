#include "tool/WaitingAgent.h"

#include <fcntl.h>
#include <signal.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <charconv>
#include <filesystem>
#include <string>
#include <string_view>

#include "agent/AgentIdentity.h"
#include "platform/FileDescriptor.h"
#include "platform/linux/Files.h"

namespace norvex {
namespace {

constexpr std::string_view kAgentProgram = "NorvexAgent";
constexpr std::size_t kLargestStatus = std::size_t{64} << 10;
constexpr std::size_t kLargestCommandLine = std::size_t{4} << 20;

// The value of a line "Name:\tvalue" of a process's status file.
std::string_view lineOf(std::string_view status, std::string_view name) {
  const std::string begin = "\n" + std::string(name) + ":\t";
  const std::size_t at = status.find(begin);
  if (at == std::string_view::npos) return {};
  status.remove_prefix(at + begin.size());
  return status.substr(0, status.find('\n'));
}

// Blocked, and so waited for: the agent takes the signal from its queue.
bool waitsForSignal(std::string_view status) {
  const std::string_view blocked = lineOf(status, "SigBlk");
  std::uint64_t mask = 0;
  std::from_chars(blocked.data(), blocked.data() + blocked.size(), mask, 16);
  return (mask >> (SIGUSR1 - 1) & 1) != 0;
}

// One that has ended keeps its name and its signals until its parent asks for it.
bool hasEnded(std::string_view status) {
  const std::string_view state = lineOf(status, "State");
  return state.starts_with('Z') || state.starts_with('X');
}

// Each argument of the command line ends with a null byte.
bool isForced(const std::string& commandLine) {
  return commandLine.find('\0' + std::string(forceArgument) + '\0') != std::string::npos;
}

bool isWaitingAgent(const std::string& process) {
  struct stat folder {};
  if (::stat(process.c_str(), &folder) != 0 || folder.st_uid != ::getuid()) return false;
  const auto text = readStartOfFile(process + "/status", kLargestStatus);
  if (!text) return false;
  const std::string status = "\n" + text.value();
  if (lineOf(status, "Name") != kAgentProgram || hasEnded(status) || !waitsForSignal(status)) return false;
  const auto commandLine = readStartOfFile(process + "/cmdline", kLargestCommandLine);
  return commandLine && !isForced(commandLine.value());
}

// By a descriptor, which stands for this process even when its number has been given to another meanwhile.
bool wake(pid_t process, const std::string& folder) {
  const FileDescriptor handle(static_cast<int>(::syscall(SYS_pidfd_open, process, 0)));
  return handle && isWaitingAgent(folder) &&
         ::syscall(SYS_pidfd_send_signal, handle.number(), SIGUSR1, nullptr, 0) == 0;
}

}  // namespace

std::optional<pid_t> wakeWaitingAgent() {
  std::error_code error;
  for (const auto& entry : std::filesystem::directory_iterator("/proc", error)) {
    const std::string name = entry.path().filename().string();
    pid_t process = 0;
    const auto [end, failure] = std::from_chars(name.data(), name.data() + name.size(), process);
    if (failure != std::errc() || end != name.data() + name.size()) continue;
    if (wake(process, entry.path().string())) return process;
  }
  return std::nullopt;
}

}  // namespace norvex
