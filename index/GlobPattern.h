// Shell patterns over names.
//
// Used by the content types, on any thread. Pure. The C library's matcher is not used: its brackets follow
// the user's locale, so that figures would differ between machines, and a pattern with many stars can hold it
// up for ever.
#pragma once

#include <cstddef>
#include <string_view>

namespace norvex {

// Whether the whole name fits the pattern: `*` any run of bytes, a leading dot included; `?` one UTF-8
// character; `[abc]`, `[a-z]`, `[!a-z]` one byte of a set; `\` takes the next character as it is. A bracket
// that is never closed stands for itself. Time is bounded by the product of the two lengths.
bool globMatches(std::string_view pattern, std::string_view name);

// How many bytes the pattern's first element has: a star, a question mark, a closed bracket, a quoted or a
// plain character. 0 for an empty pattern only.
std::size_t globElementLength(std::string_view pattern);

// Whether the pattern has any character of a special meaning; without one it matches only itself.
bool hasGlobCharacters(std::string_view pattern);

}  // namespace norvex
