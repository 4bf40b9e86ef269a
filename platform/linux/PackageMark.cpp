#include "platform/linux/PackageMark.h"

#include <sys/xattr.h>

#include <array>

#include "platform/PackageNames.h"

namespace norvex {

bool isMarkedAsPackage(int folder) {
  // A longer value does not fit and is an error, as is no value at all.
  std::array<char, 8> value;
  const ssize_t length = ::fgetxattr(folder, kPackageMarkAttribute, value.data(), value.size());
  return length >= 0 && std::string_view(value.data(), static_cast<std::size_t>(length)) == kPackageMarkValue;
}

}  // namespace norvex
