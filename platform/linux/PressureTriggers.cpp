#include "platform/linux/PressureTriggers.h"

#include <fcntl.h>
#include <linux/magic.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <sys/vfs.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <iterator>
#include <string_view>
#include <utility>

#include "platform/linux/StallLimits.h"

namespace norvex {
namespace {

constexpr short kEnded = POLLERR | POLLNVAL;

// What a FIFO or a socket has said means nothing beyond that it has said something.
constexpr std::size_t kDiscardedAtOnce = 4096;

bool isOfKernel(int file) {
  struct statfs system {};
  return ::fstatfs(file, &system) == 0 &&
         (system.f_type == PROC_SUPER_MAGIC || system.f_type == CGROUP2_SUPER_MAGIC);
}

Result<FileDescriptor> openForTrigger(const std::string& path) {
  FileDescriptor file(::open(path.c_str(), O_RDWR | O_CLOEXEC | O_NONBLOCK | O_NOCTTY));
  if (!file) return systemError(errno);
  if (!isOfKernel(file.number())) return systemError(EINVAL);
  return file;
}

int writeOnce(int file, std::string_view text) {
  ssize_t written = 0;
  do {
    written = ::write(file, text.data(), text.size());
  } while (written < 0 && errno == EINTR);
  return written < 0 ? errno : 0;
}

std::string triggerText(const char* kind, std::chrono::microseconds stall) {
  std::string text =
      kind + (' ' + std::to_string(stall.count())) + ' ' + std::to_string(kStallWindow.count());
  return text += '\0';  // which the kernel wants to see, too
}

Result<FileDescriptor> connected(const std::string& path) {
  sockaddr_un address{};
  address.sun_family = AF_UNIX;
  if (path.size() >= sizeof(address.sun_path)) return systemError(ENAMETOOLONG);
  std::copy(path.begin(), path.end(), std::begin(address.sun_path));
  FileDescriptor socket(::socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0));
  if (!socket) return systemError(errno);
  if (::connect(socket.number(), reinterpret_cast<const sockaddr*>(&address), sizeof(address)) != 0) {
    return systemError(errno);
  }
  return socket;
}

// False when there is an end and nothing else.
bool discardWhatCame(int descriptor) {
  std::array<char, kDiscardedAtOnce> content{};
  bool anything = false;
  while (true) {
    const ssize_t count = ::read(descriptor, content.data(), content.size());
    if (count > 0) {
      anything = true;
      continue;
    }
    if (count < 0 && errno == EINTR) continue;
    return anything || (count < 0 && errno == EAGAIN);
  }
}

}  // namespace

Result<std::unique_ptr<PressureSensor>> PressureTriggers::onFile(const std::string& path,
                                                                 MemoryPressureLevels levels) {
  std::vector<std::string> triggers;
  if (levels.warning) triggers.push_back(triggerText("some", kWarningStall));
  if (levels.critical) triggers.push_back(triggerText("full", kCriticalStall));
  auto sensor = std::make_unique<PressureTriggers>();
  for (const std::string& trigger : triggers) {
    Result<FileDescriptor> file = openForTrigger(path);  // a descriptor takes one trigger
    if (!file) return file.error();
    if (const int error = writeOnce(file.value().number(), trigger)) return systemError(error);
    sensor->add(std::move(file).value(), POLLPRI);
  }
  return std::unique_ptr<PressureSensor>(std::move(sensor));
}

Result<std::unique_ptr<PressureSensor>> PressureTriggers::onWatch(const std::string& path,
                                                                  const std::string& text) {
  struct stat status {};
  if (::stat(path.c_str(), &status) != 0) return systemError(errno);
  const bool isFifo = S_ISFIFO(status.st_mode);
  const bool isSocket = S_ISSOCK(status.st_mode);
  // Open for writing, too: a FIFO without a writer would be ready all the time.
  Result<FileDescriptor> file =
      isFifo ? Result<FileDescriptor>(FileDescriptor(::open(path.c_str(), O_RDWR | O_CLOEXEC | O_NONBLOCK)))
      : isSocket ? connected(path)
                 : openForTrigger(path);
  if (!file) return file.error();
  if (!file.value()) return systemError(errno);
  if (!isFifo && !text.empty()) {
    if (const int error = writeOnce(file.value().number(), text)) return systemError(error);
  }
  auto sensor = std::make_unique<PressureTriggers>();
  sensor->add(std::move(file).value(), isFifo || isSocket ? POLLIN : POLLPRI);
  return std::unique_ptr<PressureSensor>(std::move(sensor));
}

void PressureTriggers::add(FileDescriptor file, short events) {
  awaited_.push_back({file.number(), events, 0});
  files_.push_back(std::move(file));
}

PressureVerdict PressureTriggers::judge(std::span<const pollfd> awaited, Clock::Moment) {
  PressureVerdict verdict = PressureVerdict::calm;
  for (const pollfd& file : awaited) {
    if ((file.revents & kEnded) != 0) return PressureVerdict::gone;
    if ((file.revents & POLLPRI) != 0) verdict = PressureVerdict::pressure;
    if ((file.revents & (POLLIN | POLLHUP)) == 0) continue;
    if (!discardWhatCame(file.fd)) return PressureVerdict::gone;
    verdict = PressureVerdict::pressure;
  }
  return verdict;
}

}  // namespace norvex
