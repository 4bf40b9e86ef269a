#include "tool/AgentSwitch.h"

#include <cerrno>
#include <optional>

#include "agent/AgentIdentity.h"
#include "platform/Platform.h"
#include "tool/SafeText.h"

namespace norvex {

bool thisReleaseHasReported() {
  const std::optional<double> last = platform().preferenceStore.copyValue(lastVersionRunKey, agentLabel);
  return last && !(*last < static_cast<double>(currentRunVersion));
}

AgentSwitch agentSwitchOf(const ToolWorld& world, const AgentJobState& state) {
  if (platform().fileExistence.exists(world.disabledFile)) {
    return {
        false, "administrator",
        "the administrator has switched it off for everybody with the file " + safeText(world.disabledFile)};
  }
  if (state.isMaskedForAll) {
    return {false, "administrator",
            "the administrator has switched it off for everybody with a mask in /etc/systemd/user"};
  }
  if (state.doNotTrack) {
    return {false, "doNotTrack",
            "DO_NOT_TRACK is set in your session; take it out of ~/.config/environment.d and log in anew"};
  }
  if (!state.isEnabled && thisReleaseHasReported())
    return {false, "reported", "this release has reported, and the agent has switched itself off"};
  if (!state.isEnabled)
    return {false, "user", "it is switched off for you; switch it on with: norvexctl agent enable"};
  return {true, "", ""};
}

std::string jobRemedy(const Error& error) {
  if (error.code == ENOENT) return "; is the package with the agent's job installed?";
  return "; this needs the service manager of a session of yours: log in, and see norvexctl doctor";
}

}  // namespace norvex
