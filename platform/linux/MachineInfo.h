// Reader of files that assign shell variables, one a line, such as /etc/machine-info.
//
// A pure function of the text; any thread.
#pragma once

#include <string>
#include <string_view>

namespace norvex {

// The value that `text` leaves in `variable`: of the last line that assigns it, without the quotes and
// backslashes that protect it from a shell. Nothing is expanded. Empty when no line assigns it or the last
// one to do so has an unfinished quote.
std::string shellVariable(std::string_view text, std::string_view variable);

}  // namespace norvex
