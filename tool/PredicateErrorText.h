// A predicate that does not parse, shown with a mark below the place that is wrong.
//
// Any thread. Pure.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

#include "index/PredicateParser.h"

namespace norvex {

// Two lines of no more than `width` columns, each with a line feed: the predicate, or the part of it around
// the error, and a caret.
std::string predicateErrorExcerpt(std::string_view predicate, const PredicateError& error, std::size_t width);

}  // namespace norvex
