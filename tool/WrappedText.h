// Sentences broken into lines that fit.
//
// Any thread. Pure.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace norvex {

// The words of a safe text on lines of no more than so many columns; a word that is longer stands alone and
// is not cut.
std::vector<std::string> wrappedText(std::string_view text, std::size_t columns);

}  // namespace norvex
