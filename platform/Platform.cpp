#include "platform/Platform.h"

#include <atomic>
#include <cassert>

namespace norvex {
namespace {
// Written before any other thread is started; atomic so that a thread of a service that outlives a test is no
// race.
std::atomic<const Platform*> installed{nullptr};
}  // namespace

const Platform& platform() {
  const Platform* roles = installed.load(std::memory_order_acquire);
  assert(roles != nullptr && "no roles are installed");
  return *roles;
}

ScopedPlatform::ScopedPlatform(const Platform& roles)
    : previous_(installed.exchange(&roles, std::memory_order_acq_rel)) {}

ScopedPlatform::~ScopedPlatform() {
  installed.store(previous_, std::memory_order_release);
}

}  // namespace norvex
