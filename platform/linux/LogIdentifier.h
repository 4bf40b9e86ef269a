// The name under which the system's logs know the agent's lines.
#pragma once

namespace norvex {

inline constexpr const char* kLogIdentifier = "NorvexAgent";

}  // namespace norvex
