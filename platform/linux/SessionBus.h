// The user's session bus: the way to it.
//
// Used by UserManager, on its thread.
#pragma once

#include <chrono>
#include <memory>

#include "platform/Result.h"
#include "platform/linux/Environment.h"

struct sd_bus;

namespace norvex {

struct CloseBus {
  void operator()(sd_bus* bus) const;
};
using BusConnection = std::unique_ptr<sd_bus, CloseBus>;

// A connection to the bus that `environment` names (DBUS_SESSION_BUS_ADDRESS, else the one of
// XDG_RUNTIME_DIR). `limit` holds for the whole way until the bus has let us in, and for each call made on
// the connection later. Fails with an errno value; the description says that it is about the session bus.
Result<BusConnection> connectToSessionBus(const Environment& environment, std::chrono::milliseconds limit);

}  // namespace norvex
