// norvexctl log: what the agent has reported.
#pragma once

#include <optional>
#include <string>

#include "tool/ExitStatus.h"
#include "tool/ToolWorld.h"

namespace norvex {

struct LogRequest {
  std::optional<std::string> since = {};   // a moment as people write it
  std::optional<std::string> domain = {};  // a message's domain, or what it ends with after a dot
  bool json = false;
};

// Writes each message with its pairs, the newest last. Records that are damaged are told and passed over;
// that is no failure. A moment that makes no sense is ExitStatus::usage.
ExitStatus runLog(ToolWorld& world, const LogRequest& request);

}  // namespace norvex
