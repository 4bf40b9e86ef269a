#include "platform/linux/LinuxActivityScheduler.h"

#include <poll.h>
#include <sys/eventfd.h>
#include <sys/signalfd.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <iterator>
#include <system_error>
#include <utility>

namespace norvex {
namespace {

constexpr int kRunSignal = SIGUSR1;
constexpr const char* kStartedProcess = "SYSTEMD_EXEC_PID";

sigset_t runSignalSet() {
  sigset_t signals;
  ::sigemptyset(&signals);
  ::sigaddset(&signals, kRunSignal);
  return signals;
}

class CallActivity final : public Activity {
 public:
  explicit CallActivity(ActivityState state) : state_(state) {}
  ActivityState state() const override { return state_; }
  // Nobody waits for the end of the activity: the service manager sees the end of the process.
  void setState(ActivityState state) override { state_ = state; }

 private:
  ActivityState state_;
};

void call(const ActivityScheduler::Handler& handler, ActivityState state) {
  CallActivity activity(state);
  handler(activity);
}

}  // namespace

LinuxActivityScheduler::LinuxActivityScheduler(const Environment& environment)
    : startedForRun_(valueOf(environment, kStartedProcess) == std::to_string(::getpid())),
      ending_(::eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK)) {
  const sigset_t signals = runSignalSet();
  signals_ = FileDescriptor(::signalfd(-1, &signals, SFD_CLOEXEC | SFD_NONBLOCK));
}

LinuxActivityScheduler::~LinuxActivityScheduler() {
  if (!queue_.joinable()) return;
  ::eventfd_write(ending_.number(), 1);
  queue_.join();
}

void LinuxActivityScheduler::blockRunSignal() {
  const sigset_t signals = runSignalSet();
  ::pthread_sigmask(SIG_BLOCK, &signals, nullptr);
}

void LinuxActivityScheduler::registerActivity(const std::string&, ActivityCriteria, Handler handler) {
  if (queue_.joinable() || !signals_ || !ending_) return;
  try {
    queue_ = std::thread([this, kept = std::move(handler)] { serve(kept); });
  } catch (const std::system_error&) {
    // No thread to be had: the activity is never run.
  }
}

void LinuxActivityScheduler::serve(const Handler& handler) const {
  call(handler, ActivityState::checkIn);
  if (startedForRun_) call(handler, ActivityState::run);
  while (waitForRunSignal()) call(handler, ActivityState::run);
}

// True when a signal has come and been taken, false when the thread is to end.
bool LinuxActivityScheduler::waitForRunSignal() const {
  pollfd sources[] = {{ending_.number(), POLLIN, 0}, {signals_.number(), POLLIN, 0}};
  while (true) {
    if (::poll(sources, std::size(sources), -1) < 0 && errno != EINTR) return false;
    if (sources[0].revents != 0) return false;
    signalfd_siginfo taken{};
    if (::read(signals_.number(), &taken, sizeof(taken)) == sizeof(taken)) return true;
  }
}

}  // namespace norvex
