#include "index/TextFolding.h"

#include <utf8proc.h>

#include <algorithm>
#include <array>
#include <cstdint>
#include <vector>

namespace norvex {
namespace {

using Characters = std::vector<utf8proc_int32_t>;

// Takes the character at the front of `text`; false when its first byte begins none.
bool takeCharacter(std::string_view& text, utf8proc_int32_t& character) {
  const auto* const bytes = reinterpret_cast<const utf8proc_uint8_t*>(text.data());
  const auto length = utf8proc_iterate(bytes, static_cast<utf8proc_ssize_t>(text.size()), &character);
  if (length <= 0) return false;
  text.remove_prefix(static_cast<std::size_t>(length));
  return true;
}

utf8proc_option_t optionsOf(TextFolding folding) {
  int options = UTF8PROC_STABLE | UTF8PROC_COMPOSE;
  if (folding.ignoresCase) options |= UTF8PROC_CASEFOLD;
  if (folding.ignoresDiacritics) options |= UTF8PROC_STRIPMARK;
  return static_cast<utf8proc_option_t>(options);
}

// Appends what is left of a character: itself, the parts that it is composed of, or nothing.
void appendParts(Characters& characters, utf8proc_int32_t character, TextFolding folding) {
  std::array<utf8proc_int32_t, 32> parts{};  // Unicode's longest sequence has 4
  constexpr auto room = static_cast<utf8proc_ssize_t>(parts.size());
  const auto count = utf8proc_decompose_char(character, parts.data(), room, optionsOf(folding), nullptr);
  if (count < 0 || count > room) {
    characters.push_back(character);
    return;
  }
  characters.insert(characters.end(), parts.begin(), parts.begin() + count);
}

int combiningClassOf(utf8proc_int32_t character) {
  return utf8proc_get_property(character)->combining_class;
}

// Puts the marks behind each letter into their canonical order. Not left to the library, whose time grows
// with the square of the number of marks: seconds for one hostile attribute.
void orderMarks(Characters& characters) {
  const auto isMark = [](utf8proc_int32_t character) { return combiningClassOf(character) != 0; };
  for (auto begin = characters.begin(); begin != characters.end();) {
    begin = std::find_if(begin, characters.end(), isMark);
    const auto end = std::find_if_not(begin, characters.end(), isMark);
    std::ranges::stable_sort(begin, end, {}, combiningClassOf);
    begin = end;
  }
}

void appendComposed(std::string& result, Characters characters) {
  const auto options = static_cast<utf8proc_option_t>(UTF8PROC_STABLE | UTF8PROC_COMPOSE);
  const auto count = static_cast<utf8proc_ssize_t>(characters.size());
  const auto composed = utf8proc_normalize_utf32(characters.data(), count, options);
  characters.resize(static_cast<std::size_t>(std::max<utf8proc_ssize_t>(composed, 0)));
  for (const auto character : characters) {
    std::array<utf8proc_uint8_t, 4> bytes{};
    const auto length = static_cast<std::size_t>(utf8proc_encode_char(character, bytes.data()));
    result.append(bytes.begin(), bytes.begin() + length);
  }
}

}  // namespace

std::string foldedText(std::string_view text, TextFolding folding) {
  if (folding.changesNothing()) return std::string(text);
  std::string result;
  while (!text.empty()) {
    Characters characters;
    utf8proc_int32_t character = 0;
    while (!text.empty() && takeCharacter(text, character)) appendParts(characters, character, folding);
    orderMarks(characters);
    appendComposed(result, std::move(characters));
    if (text.empty()) break;
    result += text.front();
    text.remove_prefix(1);
  }
  return result;
}

}  // namespace norvex
