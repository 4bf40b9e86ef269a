#include "index/TextMatch.h"

namespace norvex {
namespace {

// Whether the pieces occur in `text` in their order, the first at its begin and the last at its end. Taking
// the leftmost occurrence of each piece is enough: it leaves the most room for those that follow.
bool matchesPieces(const std::vector<std::string>& pieces, std::string_view text) {
  if (pieces.size() == 1) return text == pieces.front();
  if (!text.starts_with(pieces.front())) return false;
  text.remove_prefix(pieces.front().size());
  for (std::size_t i = 1; i + 1 < pieces.size(); ++i) {
    const std::size_t found = text.find(pieces[i]);
    if (found == std::string_view::npos) return false;
    text.remove_prefix(found + pieces[i].size());
  }
  return text.ends_with(pieces.back());
}

}  // namespace

TextPattern patternFromSource(std::string_view source, TextFolding folding) {
  TextPattern pattern;
  pattern.folding = folding;
  for (std::size_t i = 0; i < source.size(); ++i) {
    const bool escapes = source[i] == '\\' && i + 1 < source.size();
    if (escapes) {
      pattern.pieces.back() += source[++i];
    } else if (source[i] == '*') {
      pattern.pieces.emplace_back();
    } else {
      pattern.pieces.back() += source[i];
    }
  }
  return pattern;
}

std::string sourceOfPattern(const TextPattern& pattern) {
  std::string source;
  for (const std::string& piece : pattern.pieces) {
    if (&piece != &pattern.pieces.front()) source += '*';
    for (const char c : piece) {
      if (c == '*' || c == '\\') source += '\\';
      source += c;
    }
  }
  return source;
}

TextMatcher::TextMatcher(const TextPattern& pattern) : folding_(pattern.folding) {
  pieces_.reserve(pattern.pieces.size());
  for (const std::string& piece : pattern.pieces) pieces_.push_back(foldedText(piece, folding_));
}

bool TextMatcher::matches(std::string_view text) const {
  if (folding_.changesNothing()) return matchesPieces(pieces_, text);
  return matchesPieces(pieces_, foldedText(text, folding_));
}

std::strong_ordering TextMatcher::compare(std::string_view text) const {
  if (folding_.changesNothing()) return text <=> std::string_view(pieces_.front());
  return foldedText(text, folding_) <=> pieces_.front();
}

}  // namespace norvex
