// The user's service manager, spoken to over the session bus: what it knows of units, and what it does with
// them when asked.
//
// Made by whoever has something to ask, used on one thread at a time, gone with its connection. No call lasts
// longer than the limit given to connect(), a manager that hangs included. Every failure is an Error whose
// code is an errno value and whose description names what was asked and what the manager, or the way to it,
// said: ETIMEDOUT when no answer came in time, ENOENT for a unit that is not there, ENOMEDIUM where the
// environment names no bus.
#pragma once

#include <chrono>
#include <cstdint>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "platform/Result.h"
#include "platform/linux/Environment.h"
#include "platform/linux/SessionBus.h"

namespace norvex {

// A unit as the manager has it in memory.
struct UnitStatus {
  std::string loadState;    // "loaded", "masked", "not-found", "bad-setting", "error"
  std::string activeState;  // "active", "inactive", "activating", "deactivating", "failed"
  std::string subState;     // of a timer "waiting" while it is started; of a service "running", "dead", ...
};

// The latest run of a service, as long as the manager remembers it: not beyond a log-out, and when it
// succeeded not after its timer was stopped. What is forgotten has not been.
struct ServiceRun {
  using Moment = std::chrono::system_clock::time_point;
  std::optional<Moment> started;  // absent when it has not run
  std::optional<Moment> ended;    // absent while it runs
  std::string result;             // "success", "exit-code", "signal", "timeout", "core-dump", ...
  std::int32_t exitStatus = 0;    // or the signal's number where one ended it
  std::uint32_t process = 0;      // the id of the process that runs now; 0 when none does
};

// The moments of a timer.
struct TimerMoments {
  using Moment = std::chrono::system_clock::time_point;
  std::optional<Moment> last;  // when it last triggered its service
  std::optional<Moment> next;  // when it will; absent when it is not started
};

class UserManager {
 public:
  static constexpr std::chrono::milliseconds kCallLimit{5000};

  // Connects to the bus that `environment` names (DBUS_SESSION_BUS_ADDRESS, else the one of XDG_RUNTIME_DIR).
  // Fails when there is none, when nobody listens there, and when it has not let us in within the limit. That
  // a manager is on it shows with the first question.
  static Result<UserManager> connect(const Environment& environment,
                                     std::chrono::milliseconds callLimit = kCallLimit);

  // A unit that there is no file of is no failure: its loadState is "not-found".
  Result<UnitStatus> status(const std::string& unit);

  // The units that start this one, in the order of their names: those that the manager keeps in memory,
  // because they are started or something needs them. A timer that is merely installed is not among them.
  Result<std::vector<std::string>> triggersOf(const std::string& service);

  // The unit that this timer starts, whether the timer is started or not.
  Result<std::string> unitStartedBy(const std::string& timer);

  Result<ServiceRun> lastRun(const std::string& service);
  Result<TimerMoments> momentsOf(const std::string& timer);

  // Of the unit's file and the links to it: "enabled", "disabled", "masked", "static", "linked", ...
  Result<std::string> fileState(const std::string& unit);

  // The names of the unit files, masks included, that match one of the shell patterns, in order.
  Result<std::vector<std::string>> unitFiles(const std::vector<std::string>& patterns);

  // The variables that the manager passes on to what it starts, each "NAME=value".
  Result<std::vector<std::string>> environment();

  // For this user, on the disk. What is in memory follows with reload(). A mask is set for any name, also for
  // one that no unit has: ask first. It fails with EEXIST where the unit's own file stands in its place.
  Result<void> mask(const std::string& unit);
  Result<void> unmask(const std::string& unit);
  Result<void> enable(const std::string& unit);
  Result<void> disable(const std::string& unit);

  // Reads all unit files anew.
  Result<void> reload();

  // Return when the manager has taken the order; it is carried out after that.
  Result<void> start(const std::string& unit);
  Result<void> stop(const std::string& unit);

  // Return when the order has been carried out, or has come to nothing; which of them, status() tells.
  // ETIMEDOUT when that takes longer than the limit; the manager goes on with it then.
  Result<void> startAndWait(const std::string& unit);
  Result<void> stopAndWait(const std::string& unit);

 private:
  UserManager(BusConnection bus, std::chrono::milliseconds callLimit)
      : bus_(std::move(bus)), callLimit_(callLimit) {}
  Result<void> orderAndWait(const char* method, const std::string& unit);

  BusConnection bus_;
  std::chrono::milliseconds callLimit_;
};

}  // namespace norvex
