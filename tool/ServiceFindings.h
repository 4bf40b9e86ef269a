// What norvexctl doctor finds of the system's services and of the process itself: where messages go, what
// starts the agent, what tells it to hold back.
//
// Called on the main thread, with the machine's roles installed.
#pragma once

#include "tool/Examination.h"

namespace norvex {

Finding diagnosticLog(const Examined& examined);
Finding reportedMessagesLog(const Examined& examined);
Finding systemLog(const Examined& examined);
Finding serviceManager(const Examined& examined);
Finding activityScheduler(const Examined& examined);
Finding memoryPressure(const Examined& examined);
Finding eventLoop(const Examined& examined);
Finding clockThatGoesOn(const Examined& examined);

// Puts this process last at the disk, to see whether that can be done.
Finding diskPriority(const Examined& examined);

}  // namespace norvex
