// How talkative the agent is. Nothing in the product ever assigns it; a debugger or a test does.
#pragma once

#include <cstdint>
#include <string_view>

namespace norvex {

// Lines for debugging are written only while this is greater than 0.
extern std::int64_t debugLevel;

// Writes a debug line, when debugLevel asks for it: the message, the source it comes from and the line in it,
// as "message | source:line" at notice level.
void logDebugLine(std::string_view message, std::string_view sourceName, int line);

}  // namespace norvex
