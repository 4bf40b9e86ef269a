#include "index/GlobPattern.h"

namespace norvex {
namespace {

constexpr std::size_t none = std::string_view::npos;

// The length of the bracket expression that opens at pattern[0]; none when it is never closed.
std::size_t bracketLength(std::string_view pattern) {
  std::size_t at = 1;
  if (at < pattern.size() && (pattern[at] == '!' || pattern[at] == '^')) ++at;
  if (at < pattern.size() && pattern[at] == ']') ++at;
  const std::size_t end = pattern.find(']', at);
  return end == none ? none : end + 1;
}

// `bracket` is a whole bracket expression.
bool bracketHolds(std::string_view bracket, char character) {
  std::string_view set = bracket.substr(1, bracket.size() - 2);
  const bool inverted = !set.empty() && (set.front() == '!' || set.front() == '^');
  if (inverted) set.remove_prefix(1);

  const auto byte = static_cast<unsigned char>(character);
  bool found = false;
  while (!set.empty() && !found) {
    const auto low = static_cast<unsigned char>(set[0]);
    const bool isRange = set.size() >= 3 && set[1] == '-';
    const auto high = isRange ? static_cast<unsigned char>(set[2]) : low;
    found = low <= byte && byte <= high;
    set.remove_prefix(isRange ? 3 : 1);
  }
  return found != inverted;
}

// The bytes of the character that `text`, which is not empty, begins with.
std::size_t characterLength(std::string_view text) {
  std::size_t length = 1;
  if (static_cast<unsigned char>(text[0]) < 0xC0) return length;
  while (length < text.size() && (static_cast<unsigned char>(text[length]) & 0xC0U) == 0x80U) ++length;
  return length;
}

// How much of the pattern and of the name one step takes; nothing of either when they do not fit.
struct Step {
  std::size_t ofPattern = 0;
  std::size_t ofName = 0;
};

// One step that is no star. Neither text is empty.
Step takeStep(std::string_view pattern, std::string_view name) {
  if (pattern[0] == '?') return {1, characterLength(name)};
  if (pattern[0] == '[') {
    const std::size_t length = bracketLength(pattern);
    if (length != none) return bracketHolds(pattern.substr(0, length), name[0]) ? Step{length, 1} : Step{};
  }
  const std::size_t quoted = pattern[0] == '\\' && pattern.size() > 1 ? 1 : 0;
  return pattern[quoted] == name[0] ? Step{quoted + 1, 1} : Step{};
}

}  // namespace

bool globMatches(std::string_view pattern, std::string_view name) {
  // Only the last star is ever widened: an earlier one has already found the shortest run that serves it.
  std::size_t inPattern = 0;
  std::size_t inName = 0;
  std::size_t afterStar = none;
  std::size_t starEnd = 0;
  while (inName < name.size()) {
    if (inPattern < pattern.size() && pattern[inPattern] == '*') {
      afterStar = ++inPattern;
      starEnd = inName;
      continue;
    }
    Step step;
    if (inPattern < pattern.size()) step = takeStep(pattern.substr(inPattern), name.substr(inName));
    if (step.ofName > 0) {
      inPattern += step.ofPattern;
      inName += step.ofName;
      continue;
    }
    if (afterStar == none) return false;
    inPattern = afterStar;
    inName = ++starEnd;
  }
  return pattern.find_first_not_of('*', inPattern) == none;
}

std::size_t globElementLength(std::string_view pattern) {
  if (pattern.empty()) return 0;
  if (pattern[0] == '\\' && pattern.size() > 1) return 2;
  const std::size_t bracket = pattern[0] == '[' ? bracketLength(pattern) : none;
  return bracket == none ? 1 : bracket;
}

bool hasGlobCharacters(std::string_view pattern) {
  return pattern.find_first_of("*?[\\") != none;
}

}  // namespace norvex
