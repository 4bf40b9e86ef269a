// The control group that the process runs in: how the kernel says which service a process belongs to, and
// where its figures are.
#pragma once

#include <optional>
#include <string>
#include <string_view>

#include "platform/linux/Environment.h"

namespace norvex {

// The group's path in the unified hierarchy, absolute, from the text of a process's cgroup file. Absent when
// that names none. A pure function.
std::optional<std::string> controlGroupIn(std::string_view processControlGroups);

// The group of this process. Any thread.
std::optional<std::string> ownControlGroup();

// The name of the service as which the service manager has started this very process (SYSTEMD_EXEC_PID is its
// id); empty when it runs as none.
std::string ownServiceUnit(const Environment& environment);

}  // namespace norvex
