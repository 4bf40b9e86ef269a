#include "OwnVolume.h"

#include <fcntl.h>
#include <sched.h>
#include <sys/mount.h>
#include <unistd.h>

#include <cstdlib>

namespace norvex {
namespace fs = std::filesystem;

void mountVolume(const fs::path& folder) {
  fs::create_directory(folder);
  if (unshare(CLONE_NEWNS) != 0 || mount("", "/", nullptr, MS_REC | MS_PRIVATE, nullptr) != 0 ||
      mount("tmpfs", folder.c_str(), "tmpfs", 0, "size=64m") != 0) {
    _exit(kNotAllowed);
  }
}

void makeFile(const fs::path& file, std::uintmax_t size) {
  AgentWorld::write(file, "");
  fs::resize_file(file, size);
}

int runTool(const AgentWorld& world, const std::vector<std::string>& arguments,
            const std::optional<fs::path>& output) {
  const pid_t process = fork();
  if (process != 0) return AgentWorld::wait(process);
  for (const auto& [name, value] : world.environment) setenv(name.c_str(), value.c_str(), 1);
  if (output) dup2(open(output->c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0600), STDOUT_FILENO);
  std::vector<std::string> texts = {NORVEX_TOOL_PROGRAM};
  texts.insert(texts.end(), arguments.begin(), arguments.end());
  std::vector<char*> pointers;
  for (std::string& text : texts) pointers.push_back(text.data());
  pointers.push_back(nullptr);
  execv(NORVEX_TOOL_PROGRAM, pointers.data());
  _exit(127);
}

}  // namespace norvex
