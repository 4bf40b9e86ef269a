#include "platform/linux/Environment.h"

#include <unistd.h>

#include <string_view>

namespace norvex {

Environment processEnvironment() {
  Environment environment;
  for (char** entry = environ; entry != nullptr && *entry != nullptr; ++entry) {
    const std::string_view text = *entry;
    const std::size_t equals = text.find('=');
    if (equals == std::string_view::npos) continue;
    // Of a name that stands twice the first holds, as for getenv.
    environment.emplace(text.substr(0, equals), text.substr(equals + 1));
  }
  return environment;
}

std::optional<std::string> valueOf(const Environment& environment, const std::string& name) {
  const auto entry = environment.find(name);
  if (entry == environment.end()) return std::nullopt;
  return entry->second;
}

}  // namespace norvex
