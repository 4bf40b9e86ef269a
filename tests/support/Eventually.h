// Waiting for what other processes do in their own time.
#pragma once

#include <poll.h>

#include <chrono>
#include <functional>

namespace norvex {

// Asks again and again until it is so; false when it is not so after a minute.
inline bool eventually(const std::function<bool()>& isSo) {
  constexpr std::chrono::seconds kPatience{60};
  constexpr int kStepMilliseconds = 5;
  const auto deadline = std::chrono::steady_clock::now() + kPatience;
  while (!isSo()) {
    if (std::chrono::steady_clock::now() >= deadline) return false;
    ::poll(nullptr, 0, kStepMilliseconds);
  }
  return true;
}

}  // namespace norvex
