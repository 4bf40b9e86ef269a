#include "AgentWorld.h"

#include <sched.h>
#include <sys/mount.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <iterator>
#include <sstream>
#include <stdexcept>

namespace norvex {
namespace fs = std::filesystem;

namespace {

std::vector<char*> pointersTo(std::vector<std::string>& texts) {
  std::vector<char*> pointers;
  for (std::string& text : texts) pointers.push_back(text.data());
  pointers.push_back(nullptr);
  return pointers;
}

constexpr const char* kJournalFolder = "/run/systemd/journal";

// For a child. Its messages are to go to the world's file also on a machine that has a journal: none of a
// test is to be reported there. False where the kernel does not let the journal be hidden.
bool hideJournal() {
  if (access(kJournalFolder, F_OK) != 0) return true;
  const uid_t user = geteuid();
  if (unshare(user == 0 ? CLONE_NEWNS : CLONE_NEWNS | CLONE_NEWUSER) != 0) return false;
  if (user != 0) {
    const std::string same = std::to_string(user) + " " + std::to_string(user) + " 1";
    std::ofstream map("/proc/self/uid_map");
    if (!(map << same << std::flush)) return false;
  }
  return mount("none", "/", nullptr, MS_REC | MS_PRIVATE, nullptr) == 0 &&
         mount("tmpfs", kJournalFolder, "tmpfs", 0, nullptr) == 0;
}

}  // namespace

AgentWorld::AgentWorld() {
  std::string name = (fs::temp_directory_path() / "norvex-world-XXXXXX").string();
  if (mkdtemp(name.data()) == nullptr) throw std::runtime_error("no temporary folder");
  root_ = name;
  for (const char* folder : {"home", "config", "state", "cache", "data"})
    fs::create_directory(root_ / folder);
  environment = {
      {"HOME", home()},
      {"XDG_CONFIG_HOME", config()},
      {"XDG_STATE_HOME", state()},
      {"XDG_CACHE_HOME", root_ / "cache"},
      {"XDG_DATA_HOME", root_ / "data"},
      {"PATH", "/usr/bin:/bin"},
  };
}

AgentWorld::~AgentWorld() {
  std::error_code ignored;
  fs::remove_all(root_, ignored);
}

pid_t AgentWorld::start(const std::vector<std::string>& arguments) const {
  std::vector<std::string> argumentTexts = {NORVEX_AGENT_PROGRAM};
  argumentTexts.insert(argumentTexts.end(), arguments.begin(), arguments.end());
  std::vector<std::string> environmentTexts;
  for (const auto& [name, value] : environment) environmentTexts.push_back(name + "=" + value);
  const std::vector<char*> argv = pointersTo(argumentTexts);
  const std::vector<char*> envp = pointersTo(environmentTexts);

  const pid_t process = fork();
  if (process < 0) throw std::runtime_error("no process");
  if (process > 0) return process;
  if (!hideJournal()) {
    std::perror("the journal of this machine cannot be hidden from the agent");
    _exit(126);
  }
  if (beforeExec) beforeExec();
  execve(NORVEX_AGENT_PROGRAM, argv.data(), envp.data());
  _exit(127);
}

int AgentWorld::wait(pid_t process) {
  int status = 0;
  while (waitpid(process, &status, 0) < 0) {
    if (errno != EINTR) throw std::runtime_error("the process is not ours");
  }
  return WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
}

std::vector<std::string> AgentWorld::messages() const {
  std::vector<std::string> lines;
  std::ifstream file(messagesFile());
  for (std::string line; std::getline(file, line);) lines.push_back(line);
  return lines;
}

void AgentWorld::write(const fs::path& file, const std::string& content) {
  fs::create_directories(file.parent_path());
  std::ofstream(file, std::ios::binary) << content;
}

std::optional<std::string> AgentWorld::read(const fs::path& file) {
  std::ifstream stream(file, std::ios::binary);
  if (!stream) return std::nullopt;
  return std::string(std::istreambuf_iterator<char>(stream), {});
}

}  // namespace norvex
