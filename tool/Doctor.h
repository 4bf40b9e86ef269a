// How each role of the agent is played on this machine: what plays it, whether it works, and what happens
// where it does not.
//
// Called on the main thread, with the machine's roles installed.
#pragma once

#include <vector>

#include "tool/Examination.h"

namespace norvex {

// Every finding, in a fixed order of roles. Leaves the machine as it was; only this very process comes last
// at the disk from then on, as the agent does.
std::vector<Finding> examine(const ToolWorld& world, const DoctorPlaces& places);

}  // namespace norvex
