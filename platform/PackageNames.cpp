#include "platform/PackageNames.h"

#include <algorithm>
#include <array>

namespace norvex {
namespace {

constexpr std::array<std::string_view, 11> packageExtensions = {
    ".app", ".appdir", ".bundle",        ".framework",     ".plugin",        ".vmwarevm",
    ".pvm", ".rtfd",   ".picaralibrary", ".lumvialibrary", ".sonpixlibrary",
};

// Extensions are ASCII; no locale has a say in them.
char lowered(char character) {
  return character >= 'A' && character <= 'Z' ? static_cast<char>(character - 'A' + 'a') : character;
}

bool endsWithIgnoringCase(std::string_view name, std::string_view lowerCaseEnding) {
  if (name.size() < lowerCaseEnding.size()) return false;
  name.remove_prefix(name.size() - lowerCaseEnding.size());
  return std::equal(name.begin(), name.end(), lowerCaseEnding.begin(),
                    [](char a, char b) { return lowered(a) == b; });
}

}  // namespace

bool isPackageName(std::string_view name) {
  // Most folders have no extension at all.
  if (name.find('.') == std::string_view::npos) return false;
  return std::any_of(packageExtensions.begin(), packageExtensions.end(),
                     [&](std::string_view extension) { return endsWithIgnoringCase(name, extension); });
}

}  // namespace norvex
