// Scope objects for what the bus library hands out when it is called.
//
// On the thread of the connection that they belong to.
#pragma once

#include <systemd/sd-bus.h>

#include <memory>
#include <string>

#include "platform/Result.h"

namespace norvex {

struct ReleaseBusMessage {
  void operator()(sd_bus_message* message) const { ::sd_bus_message_unref(message); }
};
using BusMessage = std::unique_ptr<sd_bus_message, ReleaseBusMessage>;

// What the other end says about a failure.
class BusError {
 public:
  BusError() = default;
  ~BusError() { ::sd_bus_error_free(&error_); }
  BusError(const BusError&) = delete;
  BusError& operator=(const BusError&) = delete;

  sd_bus_error* address() { return &error_; }

  // `result` is what the call returned: an errno value below zero. The description is "<asked>: <reason>", in
  // the C library's words where the other end has none.
  Error of(const std::string& asked, int result) const {
    Error error = systemError(-result);
    const char* said = error_.message;
    error.description = asked + ": " + (said != nullptr && *said != '\0' ? said : error.description);
    return error;
  }

 private:
  sd_bus_error error_{};
};

}  // namespace norvex
