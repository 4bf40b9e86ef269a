#include "platform/linux/ControlGroup.h"

#include <unistd.h>

#include "platform/linux/Files.h"

namespace norvex {
namespace {

constexpr const char* kOwnControlGroups = "/proc/self/cgroup";
constexpr std::size_t kLargestControlGroups = std::size_t{64} * 1024;
constexpr std::string_view kUnifiedHierarchy = "0::";
constexpr std::string_view kServiceEnding = ".service";

}  // namespace

std::optional<std::string> controlGroupIn(std::string_view processControlGroups) {
  while (!processControlGroups.empty()) {
    const std::size_t end = processControlGroups.find('\n');
    const std::string_view line = processControlGroups.substr(0, end);
    if (line.starts_with(kUnifiedHierarchy) && line.substr(kUnifiedHierarchy.size()).starts_with('/')) {
      return std::string(line.substr(kUnifiedHierarchy.size()));
    }
    if (end == std::string_view::npos) break;
    processControlGroups.remove_prefix(end + 1);
  }
  return std::nullopt;
}

std::optional<std::string> ownControlGroup() {
  const Result<std::string> text = readWholeFile(kOwnControlGroups, kLargestControlGroups);
  return text ? controlGroupIn(text.value()) : std::nullopt;
}

std::string ownServiceUnit(const Environment& environment) {
  // Children of a service inherit the variable, and their group is the service's.
  if (valueOf(environment, "SYSTEMD_EXEC_PID") != std::to_string(::getpid())) return {};
  const std::string group = ownControlGroup().value_or("/");
  const std::string unit = group.substr(group.find_last_of('/') + 1);
  return unit.ends_with(kServiceEnding) ? unit : std::string();
}

}  // namespace norvex
