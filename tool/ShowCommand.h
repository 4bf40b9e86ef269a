// norvexctl show: where the space of this machine went.
#pragma once

#include <optional>
#include <string>

#include "tool/ExitStatus.h"
#include "tool/ToolWorld.h"

namespace norvex {

struct ShowRequest {
  bool updateIndex = true;  // first, as the agent's job does
  bool json = false;
  std::optional<std::string> htmlFile = {};  // write a page there instead
};

// Writes bars for people, a JSON document, or a page into a file, which is there whole or stays as it was.
// Fails when the agent would have no record, and when the file cannot be written.
ExitStatus runShow(ToolWorld& world, const ShowRequest& request);

}  // namespace norvex
