// Whether the agent is going to run by itself, and who has decided that.
//
// On the main thread, with the machine's roles installed.
#pragma once

#include <string>

#include "platform/Result.h"
#include "tool/AgentJob.h"
#include "tool/ToolWorld.h"

namespace norvex {

struct AgentSwitch {
  bool isOn = false;
  std::string decidedBy;    // in JSON; "administrator", "doNotTrack", "reported", "user"; empty when it is on
  std::string explanation;  // for people: what decided, and how to change it
};

// Of several that have switched it off the one that would have to be asked first.
AgentSwitch agentSwitchOf(const ToolWorld& world, const AgentJobState& state);

// Whether the preferences hold the mark of this release, or a later one.
bool thisReleaseHasReported();

// What to do about a failure to reach the job: "; " and a sentence.
std::string jobRemedy(const Error& error);

}  // namespace norvex
