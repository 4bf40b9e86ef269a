#include "platform/linux/TimedJob.h"

#include <algorithm>
#include <cerrno>
#include <iterator>

namespace norvex {
namespace {

// What the manager calls a unit that neither starts by itself nor can be started, and one that nothing
// starts.
constexpr const char* kMasked = "masked";
constexpr const char* kDisabled = "disabled";
constexpr const char* kEnabled = "enabled";
constexpr const char* kLoaded = "loaded";
constexpr const char* kActive = "active";
constexpr const char* kNotFound = "not-found";

Error failure(int code, const std::string& unit, const std::string& what) {
  return Error{code, unit + ": " + what};
}

// One unit after the other, up to the first failure.
Result<void> forEach(const std::vector<std::string>& units, const auto& step) {
  for (const std::string& unit : units) {
    if (Result<void> outcome = step(unit); !outcome) return outcome;
  }
  return {};
}

Result<void> switchOff(UserManager& manager, const std::string& unit) {
  Result<void> outcome = manager.mask(unit);
  // The user has a unit file of his own where the mask would stand. His links are what can be taken away
  // then.
  if (!outcome && outcome.error().code == EEXIST) outcome = manager.disable(unit);
  return outcome;
}

Result<void> stopIfKnown(UserManager& manager, const std::string& unit) {
  Result<void> outcome = manager.stopAndWait(unit);
  if (!outcome && outcome.error().code == ENOENT) return {};  // what is not in memory does not run
  return outcome;
}

Result<void> startAndConfirm(UserManager& manager, const std::string& unit) {
  if (Result<void> outcome = manager.startAndWait(unit); !outcome) return outcome;
  const Result<UnitStatus> status = manager.status(unit);
  if (!status) return status.error();
  if (status.value().activeState == kActive) return {};
  return failure(EBUSY, unit, "still " + status.value().activeState);
}

Result<void> confirmOff(UserManager& manager, const std::string& unit) {
  const Result<UnitStatus> status = manager.status(unit);
  if (!status) return status.error();
  if (status.value().activeState == kActive) return failure(EBUSY, unit, "still active");
  const Result<std::string> state = manager.fileState(unit);
  if (!state) {
    // Disabling a unit whose file is a link takes the link away, and with it the unit.
    if (state.error().code == ENOENT) return {};
    return state.error();
  }
  if (state.value() == kMasked || state.value() == kDisabled) return {};
  return failure(EBUSY, unit, "still " + state.value());
}

}  // namespace

Result<std::vector<std::string>> TimedJob::triggers() {
  const Result<UnitStatus> status = manager_.status(service());
  if (!status) return status.error();
  if (status.value().loadState == kNotFound) return failure(ENOENT, service(), "no such unit");

  const Result<std::vector<std::string>> own = ownTimers();
  if (!own) return own.error();
  const Result<std::vector<std::string>> inMemory = manager_.triggersOf(service());
  if (!inMemory) return inMemory.error();

  std::vector<std::string> all;
  std::set_union(own.value().begin(), own.value().end(), inMemory.value().begin(), inMemory.value().end(),
                 std::back_inserter(all));
  if (all.empty()) return failure(ENOENT, service(), "no unit triggers it");
  return all;
}

Result<std::vector<std::string>> TimedJob::ownTimers() {
  const Result<std::vector<std::string>> named = manager_.unitFiles({label_ + ".timer", label_ + ".*.timer"});
  if (!named) return named.error();
  std::vector<std::string> timers;
  for (const std::string& timer : named.value()) {
    const Result<UnitStatus> status = manager_.status(timer);
    if (!status) return status.error();
    bool isOwn = status.value().loadState == kMasked;  // a mask does not say what is behind it
    if (status.value().loadState == kLoaded) {
      const Result<std::string> started = manager_.unitStartedBy(timer);
      if (!started) return started.error();
      isOwn = started.value() == service();
    }
    if (isOwn) timers.push_back(timer);
  }
  return timers;
}

Result<bool> TimedJob::isEnabled() {
  const Result<std::vector<std::string>> units = triggers();
  if (!units) return units.error();
  bool anyEnabled = false;
  const Result<void> asked = forEach(units.value(), [&](const std::string& unit) -> Result<void> {
    const Result<std::string> state = manager_.fileState(unit);
    if (!state) return state.error();
    anyEnabled = anyEnabled || state.value() == kEnabled;
    return {};
  });
  if (!asked) return asked.error();
  return anyEnabled;
}

Result<void> TimedJob::disable() {
  const Result<std::vector<std::string>> units = triggers();
  if (!units) return units.error();
  // All four steps are needed: a timer that is only masked runs on, and one that the manager has not read
  // anew is started again. The stop has to be over by then: an order that is under way while the manager
  // reads its units anew may come to nothing.
  Result<void> outcome =
      forEach(units.value(), [this](const std::string& unit) { return switchOff(manager_, unit); });
  if (outcome) {
    outcome = forEach(units.value(), [this](const std::string& unit) { return stopIfKnown(manager_, unit); });
  }
  if (outcome) outcome = manager_.reload();
  if (outcome) {
    outcome = forEach(units.value(), [this](const std::string& unit) { return confirmOff(manager_, unit); });
  }
  return outcome;
}

Result<void> TimedJob::enable() {
  const Result<std::vector<std::string>> before = triggers();
  if (!before) return before.error();
  Result<void> outcome =
      forEach(before.value(), [this](const std::string& unit) { return manager_.unmask(unit); });
  if (outcome) outcome = manager_.reload();
  if (!outcome) return outcome;

  // Behind the mask of an earlier release's timer there may be no unit any more.
  const Result<std::vector<std::string>> unmasked = triggers();
  if (!unmasked) return unmasked.error();
  outcome = forEach(unmasked.value(), [this](const std::string& unit) -> Result<void> {
    const Result<std::string> state = manager_.fileState(unit);
    if (!state) return state.error();
    return state.value() == kDisabled ? manager_.enable(unit) : Result<void>();
  });
  if (outcome) outcome = manager_.reload();
  if (outcome)
    outcome = forEach(unmasked.value(),
                      [this](const std::string& unit) { return startAndConfirm(manager_, unit); });
  return outcome;
}

}  // namespace norvex
