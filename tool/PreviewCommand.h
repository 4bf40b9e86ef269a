// norvexctl preview: what the agent would report now.
#pragma once

#include "tool/ExitStatus.h"
#include "tool/ToolWorld.h"

namespace norvex {

struct PreviewRequest {
  bool updateIndex = true;  // first, as the agent's job does
  bool json = false;
};

// Writes each message in the order of sending, each key with the exact figure and the text that would be sent
// for it, and which message would not be sent and why. Sends nothing; writes nothing but indexes. Fails when
// the agent would not report.
ExitStatus runPreview(ToolWorld& world, const PreviewRequest& request);

}  // namespace norvex
