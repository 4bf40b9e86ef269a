#include "tool/SafeText.h"

#include <wchar.h>

#include <algorithm>
#include <array>
#include <cstdint>
#include <cstdio>

#include "platform/Utf8.h"

namespace norvex {
namespace {

constexpr std::size_t kLongestCharacter = 4;  // bytes

struct CodePointRange {
  std::uint32_t first, last;
};

// Control characters, line separators, and marks that change the direction of writing or cannot be seen.
constexpr std::array<CodePointRange, 9> kUnsafe{{
    {0x00, 0x1F},
    {0x7F, 0x9F},
    {0x061C, 0x061C},
    {0x200B, 0x200F},
    {0x2028, 0x202E},
    {0x2060, 0x206F},
    {0xFEFF, 0xFEFF},
    {0xFFF9, 0xFFFB},
    {0xE0000, 0xE007F},
}};

bool isUnsafe(std::uint32_t codePoint) {
  return std::any_of(kUnsafe.begin(), kUnsafe.end(), [codePoint](const CodePointRange& range) {
    return range.first <= codePoint && codePoint <= range.last;
  });
}

// The length of the character that the text begins with; 0 when it is no UTF-8.
std::size_t characterLength(std::string_view text) {
  for (std::size_t length = 1; length <= std::min(kLongestCharacter, text.size()); ++length) {
    if (isValidUtf8(text.substr(0, length))) return length;
  }
  return 0;
}

std::uint32_t codePointOf(std::string_view character) {
  constexpr std::array<std::uint32_t, kLongestCharacter + 1> kLeadBits{0, 0x7F, 0x1F, 0x0F, 0x07};
  std::uint32_t codePoint = static_cast<unsigned char>(character[0]) & kLeadBits[character.size()];
  for (const char byte : character.substr(1)) {
    codePoint = codePoint << 6U | (static_cast<unsigned char>(byte) & 0x3FU);
  }
  return codePoint;
}

std::string escaped(const char* format, unsigned number) {
  std::array<char, 16> text{};
  std::snprintf(text.data(), text.size(), format, number);
  return text.data();
}

ShownCharacter plain(std::string text) {
  const std::size_t columns = text.size();
  return {std::move(text), columns};
}

ShownCharacter escapedCodePoint(std::uint32_t codePoint) {
  if (codePoint == '\n') return plain("\\n");
  if (codePoint == '\t') return plain("\\t");
  if (codePoint < 0x80) return plain(escaped("\\x%02X", codePoint));
  return plain(escaped(codePoint > 0xFFFF ? "\\U%08X" : "\\u%04X", codePoint));
}

ShownCharacter shown(std::string_view character) {
  const std::uint32_t codePoint = codePointOf(character);
  if (isUnsafe(codePoint)) return escapedCodePoint(codePoint);
  const int columns = ::wcwidth(static_cast<wchar_t>(codePoint));
  return {std::string(character), columns < 0 ? 1U : static_cast<std::size_t>(columns)};
}

// Takes the first character off the text.
std::string_view takeCharacter(std::string_view& text) {
  const std::string_view character = text.substr(0, characterLength(text));
  text.remove_prefix(character.size());
  return character;
}

}  // namespace

std::vector<ShownCharacter> shownCharacters(std::string_view text) {
  std::vector<ShownCharacter> characters;
  while (!text.empty()) {
    if (const std::string_view character = takeCharacter(text); !character.empty()) {
      characters.push_back(character == "\\" ? plain("\\\\") : shown(character));
      continue;
    }
    characters.push_back(plain(escaped("\\x%02X", static_cast<unsigned char>(text.front()))));
    text.remove_prefix(1);
  }
  return characters;
}

std::string safeText(std::string_view text) {
  std::string safe;
  for (const ShownCharacter& character : shownCharacters(text)) safe += character.text;
  return safe;
}

std::size_t columnsOf(std::string_view text) {
  std::size_t columns = 0;
  while (!text.empty()) {
    const std::string_view character = takeCharacter(text);
    columns += character.empty() ? 1 : shown(character).columns;
    if (character.empty()) text.remove_prefix(1);
  }
  return columns;
}

std::string fittingText(std::string_view text, std::size_t columns) {
  std::string fitting;
  std::size_t used = 0;
  while (!text.empty()) {
    const std::string_view character = takeCharacter(text);
    if (character.empty()) break;  // a safe text has no such byte
    used += shown(character).columns;
    if (used > columns) break;
    fitting += character;
  }
  return fitting;
}

}  // namespace norvex
