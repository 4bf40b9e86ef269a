#include "Session.h"

#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <charconv>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <iterator>

namespace norvex {
namespace {

std::string home() {
  const char* folder = std::getenv("HOME");
  return folder == nullptr ? "" : folder;
}

std::string commandLineOf(const std::filesystem::path& process) {
  std::ifstream file(process / "cmdline", std::ios::binary);
  std::string line{std::istreambuf_iterator<char>(file), {}};
  for (char& byte : line) {
    if (byte == '\0') byte = ' ';
  }
  return line;
}

pid_t processOf(const std::string& command) {
  for (const auto& entry : std::filesystem::directory_iterator("/proc")) {
    const std::string name = entry.path().filename();
    pid_t process = 0;
    const auto [end, error] = std::from_chars(name.data(), name.data() + name.size(), process);
    if (error != std::errc() || end != name.data() + name.size()) continue;
    if (commandLineOf(entry.path()).starts_with(command)) return process;
  }
  return 0;
}

[[noreturn]] void giveUp(const std::string& reason) {
  std::cerr << reason << std::endl;
  std::abort();
}

}  // namespace

UserManager sessionManager() {
  Result<UserManager> manager = UserManager::connect(processEnvironment());
  if (!manager) giveUp("no manager: " + manager.error().description);
  return std::move(manager).value();
}

bool shell(const std::string& command) {
  const int status = std::system(command.c_str());
  return WIFEXITED(status) && WEXITSTATUS(status) == 0;
}

std::string outputOf(const std::string& command) {
  std::string output;
  FILE* pipe = ::popen(command.c_str(), "r");
  if (pipe == nullptr) giveUp("no pipe");
  std::array<char, 4096> buffer{};
  std::size_t count = 0;
  while ((count = std::fread(buffer.data(), 1, buffer.size(), pipe)) > 0) output.append(buffer.data(), count);
  ::pclose(pipe);
  return output;
}

void logOutAndIn() {
  const pid_t before = processOf(kManagerCommand);
  if (!shell("systemctl --user exit")) giveUp("no log-out");
  const auto isNew = [&] {
    const pid_t now = processOf(kManagerCommand);
    return now != 0 && now != before &&
           shell("timeout 60 systemctl --user is-system-running --wait >/dev/null 2>&1");
  };
  if (!eventually(isNew)) giveUp("no new session: " + outputOf("systemctl --user --failed"));
}

HeldProcess::HeldProcess(const std::string& command) : process_(processOf(command)) {
  if (process_ == 0) giveUp("not in the session: " + command);
  ::kill(process_, SIGSTOP);
}

HeldProcess::~HeldProcess() {
  ::kill(process_, SIGCONT);
}

std::string unitsOfPackages() {
  return home() + "/.local/share/systemd/user";
}

std::string unitsOfUser() {
  return home() + "/.config/systemd/user";
}

std::string installJob(const std::string& name, const std::string& folder, const std::string& command) {
  const std::string label = "com.brixo." + name;
  std::filesystem::create_directories(folder);
  std::ofstream(folder + "/" + label + ".service")
      << "[Service]\nType=oneshot\nExecStart=" << command << "\n";
  std::ofstream(folder + "/" + timerOf(label))
      << "[Timer]\nOnActiveSec=1h\nUnit=" << label << ".service\n[Install]\nWantedBy=timers.target\n";
  if (!sessionManager().reload()) giveUp("no reload");
  return label;
}

}  // namespace norvex
