#include "tool/WrappedText.h"

#include <algorithm>

#include "tool/SafeText.h"

namespace norvex {

std::vector<std::string> wrappedText(std::string_view text, std::size_t columns) {
  std::vector<std::string> lines;
  while (!text.empty()) {
    const std::string_view word = text.substr(0, text.find(' '));
    text.remove_prefix(std::min(text.size(), word.size() + 1));
    if (!lines.empty() && columnsOf(lines.back()) + 1 + columnsOf(word) <= columns) {
      lines.back().append(" ").append(word);
    } else {
      lines.emplace_back(word);
    }
  }
  return lines;
}

}  // namespace norvex
