#include "platform/linux/XdgFolders.h"

#include <pwd.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <string_view>
#include <vector>

namespace norvex {
namespace {

// Never there on a Debian system, by policy: everything below it is simply missing.
constexpr std::string_view kNoHome = "/nonexistent";

constexpr std::size_t kFirstPasswordEntrySize = 4096;
constexpr std::size_t kLargestPasswordEntrySize = std::size_t{1024} * 1024;

struct BaseFolder {
  std::string XdgFolders::*folder;
  const char* variable;
  std::string_view defaultBelowHome;
};
constexpr std::array<BaseFolder, 4> kBaseFolders{{
    {&XdgFolders::config, "XDG_CONFIG_HOME", ".config"},
    {&XdgFolders::state, "XDG_STATE_HOME", ".local/state"},
    {&XdgFolders::cache, "XDG_CACHE_HOME", ".cache"},
    {&XdgFolders::data, "XDG_DATA_HOME", ".local/share"},
}};

// The path without trailing separators; absent unless it is absolute.
std::optional<std::string> absoluteFolder(std::optional<std::string> path) {
  if (!path || path->empty() || path->front() != '/') return std::nullopt;
  while (path->size() > 1 && path->back() == '/') path->pop_back();
  return path;
}

std::string below(const std::string& folder, std::string_view relativePath) {
  return (folder == "/" ? folder : folder + '/') + std::string(relativePath);
}

}  // namespace

std::optional<std::string> XdgFolders::homeInPasswordDatabase() {
  for (std::size_t size = kFirstPasswordEntrySize; size <= kLargestPasswordEntrySize; size *= 2) {
    std::vector<char> buffer(size);
    passwd entry{};
    passwd* found = nullptr;
    const int error = ::getpwuid_r(::getuid(), &entry, buffer.data(), buffer.size(), &found);
    if (error == ERANGE) continue;
    if (error != 0 || found == nullptr || found->pw_dir == nullptr) return std::nullopt;
    return std::string(found->pw_dir);
  }
  return std::nullopt;
}

XdgFolders XdgFolders::fromEnvironment(const Environment& environment, const HomeLookup& homeLookup) {
  XdgFolders folders;
  std::optional<std::string> home = absoluteFolder(valueOf(environment, "HOME"));
  if (!home) home = absoluteFolder(homeLookup());
  folders.home = home.value_or(std::string(kNoHome));
  for (const BaseFolder& base : kBaseFolders) {
    folders.*base.folder = absoluteFolder(valueOf(environment, base.variable))
                               .value_or(below(folders.home, base.defaultBelowHome));
  }
  return folders;
}

}  // namespace norvex
