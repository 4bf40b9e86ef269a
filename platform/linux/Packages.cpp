#include "platform/linux/Packages.h"

#include <sys/xattr.h>

#include <algorithm>
#include <array>

namespace norvex {
namespace {

// In lower case; any case counts.
constexpr std::array<std::string_view, 11> kExtensions = {
    ".app", ".appdir", ".bundle",        ".framework",     ".plugin",        ".vmwarevm",
    ".pvm", ".rtfd",   ".picaralibrary", ".lumvialibrary", ".sonpixlibrary",
};

constexpr const char* kMark = "user.norvex.package";
constexpr std::string_view kMarked = "1";

// ASCII only: what a name's other bytes mean depends on the user's language, what a package is does not.
char lowered(char character) {
  return character >= 'A' && character <= 'Z' ? static_cast<char>(character - 'A' + 'a') : character;
}

bool endsIn(std::string_view name, std::string_view extension) {
  if (name.size() < extension.size()) return false;
  const std::string_view end = name.substr(name.size() - extension.size());
  return std::equal(end.begin(), end.end(), extension.begin(),
                    [](char is, char wanted) { return lowered(is) == wanted; });
}

}  // namespace

bool isPackageName(std::string_view name) {
  return std::any_of(kExtensions.begin(), kExtensions.end(),
                     [name](std::string_view extension) { return endsIn(name, extension); });
}

bool isMarkedAsPackage(int folder) {
  std::array<char, 8> value;
  // A longer value does not fit and is an error, as is no value at all.
  const ssize_t length = ::fgetxattr(folder, kMark, value.data(), value.size());
  return length >= 0 && std::string_view(value.data(), static_cast<std::size_t>(length)) == kMarked;
}

}  // namespace norvex
