// Which folders people see as one file.
//
// Used by every room, on any thread. Pure.
#pragma once

#include <string_view>

namespace norvex {

// Whether a folder of this name is a package by its extension, in any case of letters. A folder may also be
// marked as a package by kPackageMarkAttribute.
bool isPackageName(std::string_view name);

// The extended attribute that makes any folder a package, and the value it must have.
inline constexpr const char* kPackageMarkAttribute = "user.norvex.package";
inline constexpr std::string_view kPackageMarkValue = "1";

}  // namespace norvex
