// The environment that the process was started with, as a value, so that nobody who depends on it reads the
// process's own at a moment of his own choosing.
#pragma once

#include <map>
#include <optional>
#include <string>

namespace norvex {

// From names to values. Any thread may read it.
using Environment = std::map<std::string, std::string>;

// A copy of the process's environment. Taken before other threads are started.
Environment processEnvironment();

// The value of `name`, absent when it is not set.
std::optional<std::string> valueOf(const Environment& environment, const std::string& name);

}  // namespace norvex
