// Where volumes begin.
//
// Any thread.
#pragma once

#include <string>

namespace norvex {

// Whether something is mounted at the path itself; links are not followed. The root always is one. False for
// what is not there.
bool isMountPoint(const std::string& path);

}  // namespace norvex
