// A user's world on disk for the real program: a home folder and private settings, state and cache folders
// below a temporary one, which goes with the object.
#pragma once

#include <sys/types.h>

#include <filesystem>
#include <functional>
#include <map>
#include <optional>
#include <string>
#include <vector>

namespace norvex {

class AgentWorld {
 public:
  AgentWorld();
  ~AgentWorld();
  AgentWorld(const AgentWorld&) = delete;
  AgentWorld& operator=(const AgentWorld&) = delete;

  const std::filesystem::path& root() const { return root_; }
  std::filesystem::path home() const { return root_ / "home"; }
  std::filesystem::path config() const { return root_ / "config"; }
  std::filesystem::path state() const { return root_ / "state"; }

  std::filesystem::path preferenceFile() const { return config() / "norvex/com.brixo.NorvexAgent.json"; }
  std::filesystem::path backupSettingsFile() const { return config() / "chronel/backup.conf"; }
  std::filesystem::path messagesFile() const { return state() / "norvex/diagnostics.jsonl"; }

  // The environment that the program gets; to be changed before start().
  std::map<std::string, std::string> environment;

  // Runs in the program's process before the program itself, for what a test wants to take away from it.
  std::function<void()> beforeExec;

  // Starts the program; whoever starts it waits for it.
  pid_t start(const std::vector<std::string>& arguments) const;

  // Starts the program and returns its exit status, or 128 and the signal's number when a signal ended it.
  int run(const std::vector<std::string>& arguments) const { return wait(start(arguments)); }
  static int wait(pid_t process);

  // The lines of the messages' file, oldest first, without their line feeds.
  std::vector<std::string> messages() const;

  static void write(const std::filesystem::path& file, const std::string& content);
  // Absent when there is no such file.
  static std::optional<std::string> read(const std::filesystem::path& file);

 private:
  std::filesystem::path root_;
};

}  // namespace norvex
