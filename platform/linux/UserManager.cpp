#include "platform/linux/UserManager.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <string_view>
#include <thread>
#include <utility>

#include "platform/linux/BusCall.h"

namespace norvex {
namespace {

using std::chrono::microseconds;
using std::chrono::steady_clock;
using std::chrono::system_clock;

constexpr const char* kManagerName = "org.freedesktop.systemd1";
constexpr const char* kManagerPath = "/org/freedesktop/systemd1";
constexpr const char* kManagerInterface = "org.freedesktop.systemd1.Manager";
constexpr const char* kJobInterface = "org.freedesktop.systemd1.Job";
constexpr const char* kUnitInterface = "org.freedesktop.systemd1.Unit";
constexpr const char* kServiceInterface = "org.freedesktop.systemd1.Service";
constexpr const char* kTimerInterface = "org.freedesktop.systemd1.Timer";

// The last moment that the clock can hold, in microseconds. The manager says "never" with a number beyond it.
constexpr std::uint64_t kLastMoment =
    static_cast<std::uint64_t>(
        std::chrono::duration_cast<microseconds>(system_clock::duration::max()).count()) /
    2;

// Arguments of its calls: what is meant is the disk, and no file of the user's own is overwritten.
constexpr int kNotOnlyForThisBoot = 0;
constexpr int kNotByForce = 0;
constexpr const char* kReplacingOtherJobs = "replace";

constexpr std::chrono::milliseconds kOrderStep{5};

std::string askedOf(const char* method, const std::string& unit) {
  return unit.empty() ? std::string(method) : method + (" of " + unit);
}

// Calls a method of the manager. `types` and the arguments are those of sd_bus_call_method(3).
template <typename... Arguments>
Result<BusMessage> call(sd_bus* bus, const char* method, const std::string& unit, const char* types,
                        Arguments... arguments) {
  BusError error;
  sd_bus_message* reply = nullptr;
  const int result = ::sd_bus_call_method(bus, kManagerName, kManagerPath, kManagerInterface, method,
                                          error.address(), &reply, types, arguments...);
  if (result < 0) return error.of(askedOf(method, unit), result);
  return BusMessage(reply);
}

Result<void> withoutReply(const Result<BusMessage>& outcome) {
  if (!outcome) return outcome.error();
  return {};
}

Result<std::string> textIn(const Result<BusMessage>& reply, const char* method, char type) {
  if (!reply) return reply.error();
  const char* text = nullptr;
  const int result = ::sd_bus_message_read_basic(reply.value().get(), type, &text);
  if (result < 0) return BusError().of(method, result);
  return std::string(text);
}

// The object that stands for the unit. The manager loads it when it has not yet.
Result<std::string> objectOf(sd_bus* bus, const std::string& unit) {
  return textIn(call(bus, "LoadUnit", unit, "s", unit.c_str()), "LoadUnit", SD_BUS_TYPE_OBJECT_PATH);
}

// The properties of one unit. Reads after the first failure do nothing; the failure is told at the end, once.
class Properties {
 public:
  Properties(sd_bus* bus, const std::string& unit) : bus_(bus), unit_(unit) {
    Result<std::string> object = objectOf(bus, unit);
    if (object) {
      object_ = std::move(object).value();
    } else {
      failure_ = object.error();
    }
  }

  std::string text(const char* interface, const char* name) {
    const BusMessage reply = read(interface, name, "s");
    const char* value = "";
    check(name, reply ? ::sd_bus_message_read_basic(reply.get(), SD_BUS_TYPE_STRING, &value) : 0);
    return value;
  }

  std::vector<std::string> names(const char* interface, const char* name) {
    const BusMessage reply = read(interface, name, "as");
    std::vector<std::string> names;
    if (!reply) return names;
    int result = ::sd_bus_message_enter_container(reply.get(), SD_BUS_TYPE_ARRAY, "s");
    const char* value = nullptr;
    while (result >= 0) {
      result = ::sd_bus_message_read_basic(reply.get(), SD_BUS_TYPE_STRING, &value);
      if (result <= 0) break;
      names.emplace_back(value);
    }
    check(name, result);
    return names;
  }

  template <typename Number>
  Number number(const char* interface, const char* name, char type) {
    const std::array<char, 2> signature{type, '\0'};
    const BusMessage reply = read(interface, name, signature.data());
    Number value{};
    check(name, reply ? ::sd_bus_message_read_basic(reply.get(), type, &value) : 0);
    return value;
  }

  std::uint64_t moment(const char* interface, const char* name) {
    return number<std::uint64_t>(interface, name, SD_BUS_TYPE_UINT64);
  }

  // `value` when everything that it was made of could be read.
  template <typename Value>
  Result<Value> checked(Value value) const {
    if (failure_) return *failure_;
    return value;
  }

 private:
  // Null after a failure.
  BusMessage read(const char* interface, const char* name, const char* type) {
    if (failure_) return nullptr;
    BusError error;
    sd_bus_message* reply = nullptr;
    const int result = ::sd_bus_get_property(bus_, kManagerName, object_.c_str(), interface, name,
                                             error.address(), &reply, type);
    BusMessage owned(reply);
    if (result < 0) failure_ = error.of(askedOf(name, unit_), result);
    return owned;
  }

  void check(const char* name, int result) {
    if (result < 0 && !failure_) failure_ = BusError().of(askedOf(name, unit_), result);
  }

  sd_bus* bus_;
  std::string unit_;
  std::string object_;
  std::optional<Error> failure_;
};

// Microseconds since 1970; 0 stands for a moment that has not been.
std::optional<system_clock::time_point> wallMoment(std::uint64_t sinceEpoch) {
  if (sinceEpoch == 0 || sinceEpoch > kLastMoment) return std::nullopt;
  return system_clock::time_point(microseconds(sinceEpoch));
}

// Microseconds of the monotonic clock, as a moment of the wall clock.
std::optional<system_clock::time_point> wallMomentOfMonotonic(std::uint64_t sinceBoot) {
  if (sinceBoot == 0 || sinceBoot > kLastMoment) return std::nullopt;
  const auto ahead = microseconds(sinceBoot) - steady_clock::now().time_since_epoch();
  return std::chrono::time_point_cast<system_clock::duration>(system_clock::now() + ahead);
}

}  // namespace

Result<UserManager> UserManager::connect(const Environment& environment,
                                         std::chrono::milliseconds callLimit) {
  Result<BusConnection> bus = connectToSessionBus(environment, callLimit);
  if (!bus) return bus.error();
  return UserManager(std::move(bus).value(), callLimit);
}

Result<UnitStatus> UserManager::status(const std::string& unit) {
  Properties properties(bus_.get(), unit);
  UnitStatus status;
  status.loadState = properties.text(kUnitInterface, "LoadState");
  status.activeState = properties.text(kUnitInterface, "ActiveState");
  status.subState = properties.text(kUnitInterface, "SubState");
  return properties.checked(std::move(status));
}

Result<std::vector<std::string>> UserManager::triggersOf(const std::string& service) {
  Properties properties(bus_.get(), service);
  std::vector<std::string> triggers = properties.names(kUnitInterface, "TriggeredBy");
  std::sort(triggers.begin(), triggers.end());
  return properties.checked(std::move(triggers));
}

Result<std::string> UserManager::unitStartedBy(const std::string& timer) {
  Properties properties(bus_.get(), timer);
  std::string unit = properties.text(kTimerInterface, "Unit");
  return properties.checked(std::move(unit));
}

Result<ServiceRun> UserManager::lastRun(const std::string& service) {
  Properties properties(bus_.get(), service);
  ServiceRun run;
  // From the first of the service's commands to the end of the last: not of the main process alone.
  run.started = wallMoment(properties.moment(kUnitInterface, "InactiveExitTimestamp"));
  run.ended = wallMoment(properties.moment(kUnitInterface, "InactiveEnterTimestamp"));
  if (run.ended && (!run.started || *run.ended < *run.started)) run.ended.reset();  // of the run before
  run.result = properties.text(kServiceInterface, "Result");
  run.exitStatus = properties.number<std::int32_t>(kServiceInterface, "ExecMainStatus", SD_BUS_TYPE_INT32);
  run.process = properties.number<std::uint32_t>(kServiceInterface, "MainPID", SD_BUS_TYPE_UINT32);
  return properties.checked(std::move(run));
}

Result<TimerMoments> UserManager::momentsOf(const std::string& timer) {
  Properties properties(bus_.get(), timer);
  TimerMoments moments;
  moments.last = wallMoment(properties.moment(kTimerInterface, "LastTriggerUSec"));
  if (properties.text(kUnitInterface, "ActiveState") == "active") {
    const auto byCalendar = wallMoment(properties.moment(kTimerInterface, "NextElapseUSecRealtime"));
    const auto byDelay = wallMomentOfMonotonic(properties.moment(kTimerInterface, "NextElapseUSecMonotonic"));
    moments.next = byCalendar && byDelay ? std::min(byCalendar, byDelay) : byCalendar ? byCalendar : byDelay;
  }
  return properties.checked(moments);
}

Result<std::string> UserManager::fileState(const std::string& unit) {
  constexpr const char* kMethod = "GetUnitFileState";
  return textIn(call(bus_.get(), kMethod, unit, "s", unit.c_str()), kMethod, SD_BUS_TYPE_STRING);
}

Result<std::vector<std::string>> UserManager::unitFiles(const std::vector<std::string>& patterns) {
  constexpr const char* kMethod = "ListUnitFilesByPatterns";
  std::vector<char*> patternList;
  patternList.reserve(patterns.size() + 1);
  for (const std::string& pattern : patterns) patternList.push_back(const_cast<char*>(pattern.c_str()));
  patternList.push_back(nullptr);

  sd_bus_message* made = nullptr;
  int result = ::sd_bus_message_new_method_call(bus_.get(), &made, kManagerName, kManagerPath,
                                                kManagerInterface, kMethod);
  const BusMessage question(made);
  if (result >= 0) result = ::sd_bus_message_append(made, "as", 0);  // files of any state
  if (result >= 0) result = ::sd_bus_message_append_strv(made, patternList.data());
  if (result < 0) return BusError().of(kMethod, result);

  BusError error;
  sd_bus_message* received = nullptr;
  result = ::sd_bus_call(bus_.get(), made, 0, error.address(), &received);
  const BusMessage reply(received);
  if (result >= 0) result = ::sd_bus_message_enter_container(received, SD_BUS_TYPE_ARRAY, "(ss)");
  std::vector<std::string> names;
  const char* path = nullptr;
  const char* state = nullptr;
  while (result >= 0 && (result = ::sd_bus_message_read(received, "(ss)", &path, &state)) > 0) {
    const std::string_view text = path;
    names.emplace_back(text.substr(text.find_last_of('/') + 1));
  }
  if (result < 0) return error.of(kMethod, result);
  std::sort(names.begin(), names.end());
  return names;
}

Result<std::vector<std::string>> UserManager::environment() {
  constexpr const char* kEnvironment = "Environment";
  BusError error;
  sd_bus_message* reply = nullptr;
  int result = ::sd_bus_get_property(bus_.get(), kManagerName, kManagerPath, kManagerInterface, kEnvironment,
                                     error.address(), &reply, "as");
  const BusMessage owned(reply);
  if (result >= 0) result = ::sd_bus_message_enter_container(reply, SD_BUS_TYPE_ARRAY, "s");
  std::vector<std::string> variables;
  const char* variable = nullptr;
  while (result >= 0 && (result = ::sd_bus_message_read_basic(reply, SD_BUS_TYPE_STRING, &variable)) > 0)
    variables.emplace_back(variable);
  if (result < 0) return error.of(kEnvironment, result);
  return variables;
}

Result<void> UserManager::mask(const std::string& unit) {
  return withoutReply(
      call(bus_.get(), "MaskUnitFiles", unit, "asbb", 1, unit.c_str(), kNotOnlyForThisBoot, kNotByForce));
}

Result<void> UserManager::unmask(const std::string& unit) {
  return withoutReply(call(bus_.get(), "UnmaskUnitFiles", unit, "asb", 1, unit.c_str(), kNotOnlyForThisBoot));
}

Result<void> UserManager::enable(const std::string& unit) {
  return withoutReply(
      call(bus_.get(), "EnableUnitFiles", unit, "asbb", 1, unit.c_str(), kNotOnlyForThisBoot, kNotByForce));
}

Result<void> UserManager::disable(const std::string& unit) {
  return withoutReply(
      call(bus_.get(), "DisableUnitFiles", unit, "asb", 1, unit.c_str(), kNotOnlyForThisBoot));
}

Result<void> UserManager::reload() {
  return withoutReply(call(bus_.get(), "Reload", "", ""));
}

Result<void> UserManager::start(const std::string& unit) {
  return withoutReply(call(bus_.get(), "StartUnit", unit, "ss", unit.c_str(), kReplacingOtherJobs));
}

Result<void> UserManager::stop(const std::string& unit) {
  return withoutReply(call(bus_.get(), "StopUnit", unit, "ss", unit.c_str(), kReplacingOtherJobs));
}

Result<void> UserManager::startAndWait(const std::string& unit) {
  return orderAndWait("StartUnit", unit);
}

Result<void> UserManager::stopAndWait(const std::string& unit) {
  return orderAndWait("StopUnit", unit);
}

Result<void> UserManager::orderAndWait(const char* method, const std::string& unit) {
  const Result<std::string> job =
      textIn(call(bus_.get(), method, unit, "ss", unit.c_str(), kReplacingOtherJobs), method,
             SD_BUS_TYPE_OBJECT_PATH);
  if (!job) return job.error();
  // The manager has an object for the order until it is done with it.
  const auto deadline = steady_clock::now() + callLimit_;
  while (true) {
    BusError error;
    sd_bus_message* reply = nullptr;
    const int result = ::sd_bus_get_property(bus_.get(), kManagerName, job.value().c_str(), kJobInterface,
                                             "State", error.address(), &reply, "s");
    const BusMessage owned(reply);
    if (::sd_bus_error_has_name(error.address(), SD_BUS_ERROR_UNKNOWN_OBJECT) > 0) return {};
    if (result < 0) return error.of(askedOf(method, unit), result);
    if (steady_clock::now() >= deadline) return BusError().of(askedOf(method, unit), -ETIMEDOUT);
    std::this_thread::sleep_for(kOrderStep);
  }
}

}  // namespace norvex
