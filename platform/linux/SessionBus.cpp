#include "platform/linux/SessionBus.h"

#include <systemd/sd-bus.h>

#include <cerrno>
#include <cstdint>
#include <optional>
#include <string>

#include "platform/linux/BusCall.h"

namespace norvex {
namespace {

using std::chrono::microseconds;
using std::chrono::steady_clock;

// A byte outside of the set that an address may hold bare becomes %XX.
std::string escapedForAddress(const std::string& path) {
  constexpr const char* kDigits = "0123456789abcdef";
  constexpr const char* kBare = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789-_/.*";
  std::string text;
  for (const char byte : path) {
    if (std::char_traits<char>::find(kBare, std::char_traits<char>::length(kBare), byte) != nullptr) {
      text += byte;
      continue;
    }
    const auto value = static_cast<unsigned char>(byte);
    text += {'%', kDigits[value / 16], kDigits[value % 16]};
  }
  return text;
}

std::optional<std::string> busAddress(const Environment& environment) {
  std::optional<std::string> address = valueOf(environment, "DBUS_SESSION_BUS_ADDRESS");
  if (address && !address->empty()) return address;
  const std::optional<std::string> folder = valueOf(environment, "XDG_RUNTIME_DIR");
  if (!folder || !folder->starts_with('/')) return std::nullopt;
  return "unix:path=" + escapedForAddress(*folder + "/bus");
}

int startConnecting(sd_bus* bus, const std::string& address) {
  int result = ::sd_bus_set_address(bus, address.c_str());
  if (result >= 0) result = ::sd_bus_set_bus_client(bus, 1);
  if (result >= 0) result = ::sd_bus_start(bus);
  return result;
}

// The library's own limit for the time until the bus has let us in is a minute and a half, and cannot be set.
int waitUntilConnected(sd_bus* bus, microseconds limit) {
  const auto deadline = steady_clock::now() + limit;
  while (true) {
    int result = ::sd_bus_is_ready(bus);
    if (result != 0) return result;
    result = ::sd_bus_process(bus, nullptr);
    if (result < 0) return result;
    if (result > 0) continue;
    const auto left = std::chrono::duration_cast<microseconds>(deadline - steady_clock::now());
    if (left <= microseconds::zero()) return -ETIMEDOUT;
    result = ::sd_bus_wait(bus, static_cast<std::uint64_t>(left.count()));
    if (result < 0 && result != -EINTR) return result;
  }
}

}  // namespace

void CloseBus::operator()(sd_bus* bus) const {
  // Without writing what is left: that could wait for a bus that does not read.
  ::sd_bus_close_unref(bus);
}

Result<BusConnection> connectToSessionBus(const Environment& environment, std::chrono::milliseconds limit) {
  constexpr const char* kAsked = "Session bus";
  const std::optional<std::string> address = busAddress(environment);
  if (!address) return BusError().of(kAsked, -ENOMEDIUM);
  sd_bus* made = nullptr;
  int result = ::sd_bus_new(&made);
  if (result < 0) return BusError().of(kAsked, result);
  BusConnection bus(made);
  result = ::sd_bus_set_method_call_timeout(made, static_cast<std::uint64_t>(microseconds(limit).count()));
  if (result >= 0) result = startConnecting(made, *address);
  if (result >= 0) result = waitUntilConnected(made, limit);
  if (result < 0) return BusError().of(kAsked, result);
  return bus;
}

}  // namespace norvex
