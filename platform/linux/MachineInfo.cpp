#include "platform/linux/MachineInfo.h"

namespace norvex {
namespace {

constexpr std::string_view kBlanks = " \t\r";

// The characters that a backslash protects between double quotes; before any other it stands for itself.
constexpr std::string_view kProtectedInDoubleQuotes = "\"\\$`";

std::string_view withoutLeadingBlanks(std::string_view text) {
  const std::size_t start = text.find_first_not_of(kBlanks);
  return start == std::string_view::npos ? std::string_view() : text.substr(start);
}

// Reads one shell word from the start of `text`; what follows it is left alone.
std::string unquotedWord(std::string_view text) {
  std::string word;
  char quote = '\0';
  for (std::size_t at = 0; at < text.size(); ++at) {
    const char character = text[at];
    if (quote == '\0' && kBlanks.find(character) != std::string_view::npos) return word;
    if (quote == '\0' && (character == '"' || character == '\'')) {
      quote = character;
    } else if (quote != '\0' && character == quote) {
      quote = '\0';
    } else if (character == '\\' && quote != '\'' && at + 1 < text.size()) {
      const char next = text[++at];
      if (quote == '"' && kProtectedInDoubleQuotes.find(next) == std::string_view::npos) word += character;
      word += next;
    } else {
      word += character;
    }
  }
  return quote == '\0' ? word : std::string();
}

}  // namespace

std::string shellVariable(std::string_view text, std::string_view variable) {
  std::string value;
  while (!text.empty()) {
    const std::size_t end = text.find('\n');
    std::string_view line = withoutLeadingBlanks(text.substr(0, end));
    text = end == std::string_view::npos ? std::string_view() : text.substr(end + 1);
    if (!line.starts_with(variable)) continue;
    line.remove_prefix(variable.size());
    if (line.starts_with('=')) value = unquotedWord(line.substr(1));
  }
  return value;
}

}  // namespace norvex
