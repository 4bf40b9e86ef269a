// Texts with wildcards, and whether another text matches one.
//
// Any thread. Pure; the classes are plain values.
#pragma once

#include <compare>
#include <string>
#include <string_view>
#include <vector>

#include "index/TextFolding.h"

namespace norvex {

// The texts around the wildcards, in their order. One wildcard stands between any two of them, so there is
// always at least one text; it may be empty.
struct TextPattern {
  std::vector<std::string> pieces{std::string()};
  TextFolding folding;

  bool hasWildcard() const { return pieces.size() > 1; }
  // Whether it stands for exactly one sequence of bytes.
  bool isPlain() const { return !hasWildcard() && folding.changesNothing(); }
  friend bool operator==(const TextPattern&, const TextPattern&) = default;
};

// Reads what stands between the quotes of a predicate: "*" is a wildcard, a backslash takes its meaning from
// the byte that follows. A backslash at the very end stands for itself.
TextPattern patternFromSource(std::string_view source, TextFolding folding);

// The source from which patternFromSource makes the same pieces.
std::string sourceOfPattern(const TextPattern& pattern);

// A pattern made ready to be held against many texts.
class TextMatcher {
 public:
  explicit TextMatcher(const TextPattern& pattern);

  // Whether the whole text matches; a wildcard stands for any bytes, also none.
  bool matches(std::string_view text) const;

  // Where `text` stands against a pattern without wildcards, by the bytes of their folded forms.
  std::strong_ordering compare(std::string_view text) const;

 private:
  std::vector<std::string> pieces_;  // folded
  TextFolding folding_;
};

}  // namespace norvex
