#include "agent/main.h"

#include <algorithm>
#include <chrono>
#include <cstdint>
#include <cstdio>
#include <memory>
#include <mutex>
#include <string>

#include "agent/AgentIdentity.h"
#include "platform/Platform.h"
#include "scanner/DebugLevel.h"
#include "scanner/NVXScanner.h"

namespace norvex {
namespace {

// 1000 MiB. An agent that has grown beyond this while memory is short does more harm than its report is
// worth.
constexpr std::uint64_t memoryLimitBytes = 1'048'576'000;

// Where the summary line says that it comes from; people search their logs for it, so it stays put when code
// moves.
constexpr const char* summarySourceName = "main";
constexpr int summaryLine = 60;

// The watchdog's subscription. Never given back: the watch ends with the process.
std::unique_ptr<MemoryPressureEvents> memoryWatchdog;
std::once_flag memoryWatchdogInstalled;

bool isForced(const std::vector<std::string>& arguments) {
  if (arguments.empty()) return false;
  return std::find(arguments.begin() + 1, arguments.end(), forceArgument) != arguments.end();
}

bool thisReleaseHasReported() {
  const std::optional<double> lastVersionRun =
      platform().preferenceStore.copyValue(lastVersionRunKey, agentLabel);
  return lastVersionRun.has_value() && !(*lastVersionRun < static_cast<double>(currentRunVersion));
}

void recordThisRelease() {
  PreferenceStore& preferences = platform().preferenceStore;
  preferences.setValue(lastVersionRunKey, currentRunVersion, agentLabel);
  preferences.synchronize(agentLabel);
}

void logSummary(const NVXScannerResults& results, std::chrono::duration<double> elapsed) {
  // The summary takes work and holds exact figures: it is not even built unless it is asked for.
  if (debugLevel <= 0) return;
  char completed[64];
  std::snprintf(completed, sizeof completed, "Norvex Scan completed in %.1f seconds.\n\n", elapsed.count());
  logDebugLine(completed + results.description() + "\n", summarySourceName, summaryLine);
}

// Does not return.
void finish(Activity& activity) {
  activity.setState(ActivityState::done);
  platform().processControl.exit(0);
}

}  // namespace

int main() {
  ProcessControl& process = platform().processControl;
  process.allowSuddenTermination();
  process.throttleDiskIO();
  if (isForced(process.arguments())) {
    runScanAndReport();
    return 0;
  }
  platform().activityScheduler.registerActivity(agentLabel, ActivityCriteria::checkIn, handleActivity);
  for (;;) platform().eventLoops.main().run();
}

void handleActivity(Activity& activity) {
  if (activity.state() != ActivityState::run) return;
  if (!thisReleaseHasReported()) {
    std::call_once(memoryWatchdogInstalled, startMemoryWatchdog);
    // The job stays on when there was nothing to report: the scheduler is to try again at a later
    // opportunity.
    if (!runScanAndReport()) return finish(activity);
  }
  disableAgentJob();
  finish(activity);
}

bool runScanAndReport() {
  const Clock::Moment started = platform().clock.now();
  NVXScanner scanner;
  const std::unique_ptr<NVXScannerResults> results = scanner.scan();
  if (results == nullptr) return false;

  // From the first message to the record of the release nothing may come between: a report that is sent but
  // not recorded would be sent again.
  platform().processControl.disallowSuddenTermination();
  results->logToWendal();
  const std::chrono::duration<double> elapsed = platform().clock.now() - started;
  recordThisRelease();
  logSummary(*results, elapsed);
  return true;
}

void disableAgentJob() {
  const Result<void> outcome = platform().jobRegistry.disableJob(JobDomain::user, agentLabel);
  const std::string label = agentLabel;
  if (outcome.ok()) {
    platform().systemLog.syslog(LogLevel::notice, label + " disabled");
  } else {
    platform().systemLog.syslog(LogLevel::error,
                                "Failed to disable " + label + ", error: " + outcome.error().description);
  }
}

void startMemoryWatchdog() {
  memoryWatchdog = platform().memoryPressureSource.create({.warning = true, .critical = true});
  memoryWatchdog->setHandler(onMemoryPressure);
  memoryWatchdog->resume();
}

void onMemoryPressure() {
  const Result<MemoryUse> use = platform().processMemoryInfo.ownProcess();
  if (!use.ok()) return;  // the next event asks again
  if (use.value().internal + use.value().compressed <= memoryLimitBytes) return;
  platform().systemLog.syslog(LogLevel::error,
                              "Norvex Memory Watchdog: Critical memory pressure detected. Exiting.");
  // Switched off although nothing was reported: where memory is this short, a next run would end the same
  // way.
  disableAgentJob();
  platform().processControl.exit(0);
}

}  // namespace norvex
