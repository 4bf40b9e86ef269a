// Texts without their differences of case and of diacritics.
//
// Any thread. Pure.
#pragma once

#include <string>
#include <string_view>

namespace norvex {

struct TextFolding {
  bool ignoresCase = false;
  bool ignoresDiacritics = false;

  bool changesNothing() const { return !ignoresCase && !ignoresDiacritics; }
  friend bool operator==(const TextFolding&, const TextFolding&) = default;
};

// The form in which two texts are equal that differ only in what `folding` ignores.
//
// Without any folding the bytes as they are. Otherwise composed canonically, so that it does not matter how
// an accented letter is stored; case is removed as Unicode folds it ("ß" becomes "ss"); every combining mark
// is removed, vowel signs included, while letters such as "ø" that are no letter with a mark stay. Bytes that
// are not UTF-8 stay as they are, between the folded texts around them.
std::string foldedText(std::string_view text, TextFolding folding);

}  // namespace norvex
