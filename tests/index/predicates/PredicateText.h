// A parsed predicate as text with every parenthesis, so that a test shows how it was understood.
#pragma once

#include <string>

#include "index/Predicate.h"

namespace norvex::test {

// E.g. `((a == 1) && (b >= 1 <= 'x'cd))`, a real number with an "r" behind it. A wildcard stands as "*", a
// star of the text as "\*".
std::string textOf(const Predicate& predicate);

}  // namespace norvex::test
