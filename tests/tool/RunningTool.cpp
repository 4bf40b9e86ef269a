#include "RunningTool.h"

#include <fcntl.h>
#include <signal.h>
#include <stdlib.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <stdexcept>

namespace norvex {
namespace {

struct Ends {
  int reader = -1, writer = -1;
};

Ends makePipe() {
  std::array<int, 2> fds{};
  if (::pipe2(fds.data(), O_CLOEXEC) != 0) throw std::runtime_error("no pipe");
  return {fds[0], fds[1]};
}

Ends makeTerminal() {
  const int master = ::posix_openpt(O_RDWR | O_NOCTTY | O_CLOEXEC);
  if (master < 0 || ::grantpt(master) != 0 || ::unlockpt(master) != 0)
    throw std::runtime_error("no terminal");
  const int slave = ::open(::ptsname(master), O_RDWR | O_NOCTTY | O_CLOEXEC);
  if (slave < 0) throw std::runtime_error("no terminal");
  return {master, slave};
}

std::vector<char*> pointersTo(std::vector<std::string>& texts) {
  std::vector<char*> pointers;
  for (std::string& text : texts) pointers.push_back(text.data());
  pointers.push_back(nullptr);
  return pointers;
}

}  // namespace

RunningTool::RunningTool(const std::string& folder, const std::vector<std::string>& arguments,
                         ErrorsGoTo errorsGoTo) {
  std::vector<std::string> argumentTexts{NORVEX_TOOL_PROGRAM};
  argumentTexts.insert(argumentTexts.end(), arguments.begin(), arguments.end());
  std::vector<std::string> environment{"HOME=" + folder,
                                       "XDG_CONFIG_HOME=" + folder + "/config",
                                       "XDG_CACHE_HOME=" + folder + "/cache",
                                       "XDG_DATA_HOME=" + folder + "/data",
                                       "PATH=/usr/bin:/bin",
                                       "TERM=xterm"};
  const std::vector<char*> argv = pointersTo(argumentTexts), envp = pointersTo(environment);
  const Ends ends = errorsGoTo == ErrorsGoTo::pipe ? makePipe() : makeTerminal();
  process_ = ::fork();
  if (process_ < 0) throw std::runtime_error("no process");
  if (process_ == 0) {
    ::dup2(::open("/dev/null", O_RDWR), STDOUT_FILENO);
    ::dup2(ends.writer, STDERR_FILENO);
    ::execve(NORVEX_TOOL_PROGRAM, argv.data(), envp.data());
    ::_exit(127);
  }
  ::close(ends.writer);
  errorFd_ = ends.reader;
}

RunningTool::~RunningTool() {
  if (process_ > 0) {
    ::kill(process_, SIGKILL);
    ::waitpid(process_, nullptr, 0);
  }
  ::close(errorFd_);
}

bool RunningTool::readErrors() {
  std::array<char, 4096> piece{};
  ssize_t length = 0;
  do {
    length = ::read(errorFd_, piece.data(), piece.size());  // the end of a terminal is a failure
  } while (length < 0 && errno == EINTR);
  if (length <= 0) return false;
  errors_.append(piece.data(), static_cast<std::size_t>(length));
  return true;
}

bool RunningTool::waitForError(const std::string& text) {
  while (errors_.find(text) == std::string::npos) {
    if (!readErrors()) return false;
  }
  return true;
}

void RunningTool::signal(int number) const {
  ::kill(process_, number);
}

int RunningTool::wait() {
  while (readErrors()) {
  }
  int status = 0;
  while (::waitpid(process_, &status, 0) < 0) {
    if (errno != EINTR) throw std::runtime_error("the process is not ours");
  }
  process_ = -1;
  return WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
}

}  // namespace norvex
