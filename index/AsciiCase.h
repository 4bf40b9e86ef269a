// Letters of names, whatever the user's locale says about them.
//
// Used by the content types and the rules of items, on any thread. Pure.
#pragma once

#include <algorithm>
#include <string_view>

namespace norvex {

constexpr char asciiLowered(char character) {
  return character >= 'A' && character <= 'Z' ? static_cast<char>(character - 'A' + 'a') : character;
}

// Whether the name ends with the text, which holds no capitals, in any case of letters.
constexpr bool endsWithIgnoringCase(std::string_view name, std::string_view lowerCaseEnding) {
  if (name.size() < lowerCaseEnding.size()) return false;
  name.remove_prefix(name.size() - lowerCaseEnding.size());
  return std::equal(name.begin(), name.end(), lowerCaseEnding.begin(),
                    [](char a, char b) { return asciiLowered(a) == b; });
}

}  // namespace norvex
