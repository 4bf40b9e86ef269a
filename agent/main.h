// The agent's entry: whether a run happens, the run itself, switching the job off, and the memory watchdog.
//
// The operations reach the operating system through the installed roles only; NorvexAgent.cpp installs the
// real ones.
#pragma once

#include "platform/ActivityScheduler.h"

namespace norvex {

// Prepares the process and runs it. With the argument "--force" scans and reports at once and returns 0.
// Otherwise registers with the scheduler and serves the main thread's event loop; the process then ends
// inside handleActivity or onMemoryPressure, and this never returns. On the main thread.
int main();

// The scheduler's handler, on the scheduler's queue. In the run state: scans and reports unless this release
// already has, switches the job off and ends the process with status 0. In any other state: returns, nothing
// has happened.
void handleActivity(Activity& activity);

// Scans, reports and records the release. False when the scan gave no record; nothing is reported or recorded
// then.
bool runScanAndReport();

// Switches the agent's job off and logs the outcome.
void disableAgentJob();

// Installs the memory watchdog. To be called once a process, before a scheduled scan.
void startMemoryWatchdog();

// The watchdog's handler, on a background thread beside the scan. Ends the process when its memory has grown
// beyond the limit; otherwise returns, nothing has happened.
void onMemoryPressure();

}  // namespace norvex
