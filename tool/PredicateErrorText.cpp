#include "tool/PredicateErrorText.h"

#include <algorithm>
#include <vector>

#include "platform/Utf8.h"
#include "tool/SafeText.h"

namespace norvex {
namespace {

constexpr std::size_t kIndent = 2;

// The characters as the error counts them: bytes where the text is not UTF-8. A backslash stays one: people
// look for what they have typed.
std::vector<ShownCharacter> countedCharacters(std::string_view text) {
  std::vector<ShownCharacter> characters;
  if (isValidUtf8(text)) {
    characters = shownCharacters(text);
  } else {
    for (std::size_t at = 0; at < text.size(); ++at)
      characters.push_back(shownCharacters(text.substr(at, 1)).front());
  }
  for (ShownCharacter& character : characters) {
    if (character.text == "\\\\") character = {"\\", 1};
  }
  return characters;
}

}  // namespace

std::string predicateErrorExcerpt(std::string_view predicate, const PredicateError& error,
                                  std::size_t width) {
  const std::vector<ShownCharacter> characters = countedCharacters(predicate);
  const std::size_t wrong = std::min(std::max<std::size_t>(error.column, 1) - 1, characters.size());
  const std::size_t room = width > kIndent + 1 ? width - kIndent - 1 : 1;
  // As much as fits of what stands before the error, but not more than leaves a third for what follows.
  std::size_t first = wrong, before = 0;
  while (first > 0 && before + characters[first - 1].columns <= room * 2 / 3)
    before += characters[--first].columns;
  std::string line(kIndent, ' ');
  std::size_t used = 0;
  for (std::size_t at = first; at < characters.size(); ++at) {
    used += characters[at].columns;
    if (used > room) break;
    line += characters[at].text;
  }
  return line + "\n" + std::string(kIndent + before, ' ') + "^\n";
}

}  // namespace norvex
