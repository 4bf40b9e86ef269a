// Which folders are packages: folders that people see as one file.
//
// Used on any thread.
#pragma once

#include <string_view>

namespace norvex {

// Whether a folder of this name is a package whatever else is known about it.
bool isPackageName(std::string_view name);

// Whether the open folder carries the mark that makes any folder a package. No, when that cannot be read.
bool isMarkedAsPackage(int folder);

}  // namespace norvex
