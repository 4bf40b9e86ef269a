// norvexctl doctor: what of the agent works on this machine, what does not, and what to do.
#pragma once

#include "tool/Doctor.h"
#include "tool/ExitStatus.h"
#include "tool/ToolWorld.h"

namespace norvex {

struct DoctorRequest {
  bool json = false;
};

// Fails when something is broken; what has a substitute is no failure.
ExitStatus runDoctor(ToolWorld& world, const DoctorRequest& request, const DoctorPlaces& places);

}  // namespace norvex
