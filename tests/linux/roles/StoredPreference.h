// The one preference that the tests of the store write and read, each time through a store of its own.
#pragma once

#include <cstdint>
#include <optional>
#include <string>

#include "platform/linux/JsonPreferenceStore.h"

namespace norvex {

inline constexpr const char* kDomain = "com.brixo.NorvexAgent";
inline constexpr const char* kFile = "com.brixo.NorvexAgent.json";
inline constexpr const char* kKey = "LastVersionRun";

inline void store(const std::string& folder, std::int64_t value) {
  JsonPreferenceStore preferences(folder);
  preferences.setValue(kKey, value, kDomain);
  preferences.synchronize(kDomain);
}

inline std::optional<double> stored(const std::string& folder) {
  return JsonPreferenceStore(folder).copyValue(kKey, kDomain);
}

}  // namespace norvex
