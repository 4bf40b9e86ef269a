// What the keys of a message have in common, and people need to read only once.
//
// Any thread. Pure.
#pragma once

#include <algorithm>
#include <span>
#include <string_view>

namespace norvex {

// The first key up to its last dot when every key begins so; else nothing.
inline std::string_view commonKeyPrefix(std::span<const std::string_view> keys) {
  if (keys.empty()) return {};
  const std::string_view prefix = keys.front().substr(0, keys.front().rfind('.') + 1);
  const bool isCommon =
      std::all_of(keys.begin(), keys.end(), [&](std::string_view key) { return key.starts_with(prefix); });
  return isCommon ? prefix : std::string_view();
}

}  // namespace norvex
