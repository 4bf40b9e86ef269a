#include "tool/ServiceFindings.h"

#include <sys/socket.h>
#include <sys/syscall.h>
#include <sys/un.h>
#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <cstring>
#include <memory>

#include "platform/FileDescriptor.h"
#include "platform/Platform.h"
#include "platform/linux/IoPriority.h"
#include "platform/linux/PressureTriggers.h"
#include "tool/AgentSwitch.h"
#include "tool/SafeText.h"

namespace norvex {
namespace {

using State = Finding::State;

// How long an input may take that nothing stands in the way of.
constexpr std::chrono::seconds kPatience{5};

// Whether somebody listens at a datagram socket: 0, or the errno value. Nothing is sent.
int listenerAt(const std::string& path) {
  sockaddr_un address{};
  address.sun_family = AF_UNIX;
  if (path.size() >= sizeof address.sun_path) return ENAMETOOLONG;
  std::memcpy(address.sun_path, path.c_str(), path.size() + 1);
  const FileDescriptor socket(::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0));
  if (!socket) return errno;
  const auto* generic = reinterpret_cast<const sockaddr*>(&address);
  return ::connect(socket.number(), generic, sizeof address) == 0 ? 0 : errno;
}

std::string reasonOf(int error) {
  return systemError(error).description;
}

bool comesLastAtTheDisk() {
  const long priority = ::syscall(SYS_ioprio_get, kIoPriorityOfProcess, 0);
  return priority >= 0 && ioClassOf(static_cast<int>(priority)) == kIoClassIdle;
}

}  // namespace

Finding diagnosticLog(const Examined& examined) {
  const std::string role = "Diagnostic log";
  const int error = listenerAt(examined.places.journalSocket);
  if (error == 0) return {role, State::works, "the system's journal", ""};
  return {role, State::fallsBack,
          "no journal listens at " + examined.places.journalSocket + " (" + reasonOf(error) +
              "); messages go to the file " + safeText(examined.world.messagesFile),
          "start systemd-journald, if messages are to be collected"};
}

Finding reportedMessagesLog(const Examined& examined) {
  const std::string role = "Reading of what was reported";
  const auto entries = examined.world.agentJournal.entriesSince(examined.world.secondsSince1970());
  if (entries) return {role, State::works, "the journal can be read", ""};
  return {role, State::fallsBack, entries.error().description + "; only the agent's own file is read",
          "become a member of the group systemd-journal"};
}

Finding systemLog(const Examined& examined) {
  const std::string role = "System log";
  const int error = listenerAt(examined.places.systemLogSocket);
  if (error == 0) return {role, State::works, "the system log at " + examined.places.systemLogSocket, ""};
  return {role, State::fallsBack,
          "nobody listens at " + examined.places.systemLogSocket + " (" + reasonOf(error) +
              "); the agent's lines about failures are lost",
          "start systemd-journald or another system log"};
}

Finding serviceManager(const Examined& examined) {
  const std::string role = "Service manager";
  const auto state = examined.world.agentJob.state();
  if (!state) {
    return {role, State::broken, state.error().description + "; the agent does not run by itself",
            state.error().code == ENOENT ? "install the package with the agent's job"
                                         : "log in to a session that systemd manages"};
  }
  const AgentSwitch agentSwitch = agentSwitchOf(examined.world, state.value());
  return {role, State::works,
          agentSwitch.isOn ? "the agent's job is on" : "the agent's job is off: " + agentSwitch.explanation,
          ""};
}

Finding activityScheduler(const Examined& examined) {
  const std::string role = "Start of a run";
  if (examined.world.agentJob.state()) {
    return {role, State::works,
            "by the service manager; an agent that was started by hand waits for the signal USR1", ""};
  }
  return {role, State::fallsBack,
          "nobody starts a run; an agent that was started by hand waits for the signal USR1",
          "start NorvexAgent, and give it the word with: norvexctl agent run"};
}

Finding memoryPressure(const Examined& examined) {
  const std::string role = "Memory pressure";
  std::string refused;
  // One trigger shows it; taking each away again makes the kernel wait.
  for (const std::string& file : examined.places.pressureFiles) {
    const auto triggers = PressureTriggers::onFile(file, {.warning = true, .critical = false});
    if (triggers) return {role, State::works, "triggers of the kernel at " + safeText(file), ""};
    refused += (refused.empty() ? "" : ", ") + safeText(file) + ": " + triggers.error().description;
  }
  return {role, State::fallsBack,
          "no trigger of the kernel (" + (refused.empty() ? "it has no files of pressure" : refused) +
              "); the agent looks every few seconds how much memory is left",
          "boot the kernel with psi=1, if it can"};
}

Finding eventLoop(const Examined&) {
  const std::string role = "Event loop";
  EventLoop& loop = platform().eventLoops.current();
  const auto hasRun = std::make_shared<bool>(false);  // an input that stays behind outlives this look
  loop.post([hasRun] { *hasRun = true; });
  const Clock::Moment deadline = platform().clock.now() + kPatience;
  while (!*hasRun && loop.runOnce(deadline)) {
  }
  if (*hasRun)
    return {role, State::works, "a queue of the thread's own; what was put into it has been done", ""};
  return {role, State::broken, "what was put into the thread's queue is not done; no query would end", ""};
}

Finding clockThatGoesOn(const Examined&) {
  const std::string role = "Clock";
  const Clock::Moment before = platform().clock.now();
  if (platform().clock.now() >= before) return {role, State::works, "the kernel's monotonic clock", ""};
  return {role, State::broken, "the kernel's monotonic clock goes back; no deadline can be kept",
          "choose another one in /sys/devices/system/clocksource"};
}

Finding diskPriority(const Examined&) {
  const std::string role = "Priority at the disk";
  platform().processControl.throttleDiskIO();
  if (comesLastAtTheDisk())
    return {role, State::works, "the kernel lets the agent read when nobody else does", ""};
  return {role, State::fallsBack, "the kernel does not lower it; the agent reads beside other programs", ""};
}

}  // namespace norvex
