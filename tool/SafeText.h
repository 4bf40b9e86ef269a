// Names of files as they can be shown to people: no name may move the cursor, change colours or the direction
// of writing, or look like two lines.
//
// Any thread. Pure.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace norvex {

// What is seen as one character, and the columns that it takes.
struct ShownCharacter {
  std::string text;
  std::size_t columns = 1;
};

// The characters of a text as they can be shown. Control characters and those that change the direction of
// writing stand as \n, \t, \x1B or \u202E, a backslash as \\, bytes that are no UTF-8 as \xFF.
std::vector<ShownCharacter> shownCharacters(std::string_view text);

// The same as one text. Different texts stay different.
std::string safeText(std::string_view text);

// How many columns the text takes on a terminal; its characters are safe ones.
std::size_t columnsOf(std::string_view text);

// The beginning of a safe text that fits into so many columns.
std::string fittingText(std::string_view text, std::size_t columns);

}  // namespace norvex
