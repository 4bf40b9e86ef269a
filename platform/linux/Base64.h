// Binary values as they stand in environment variables.
//
// A pure function; any thread.
#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace norvex {

// The bytes that the standard alphabet's `text`, padded to groups of four, stands for. Absent when it is not
// that.
std::optional<std::string> base64Decoded(std::string_view text);

}  // namespace norvex
