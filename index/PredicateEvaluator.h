// A predicate held against one item in memory.
//
// Any thread. Pure, apart from what the reader does.
#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <string_view>
#include <variant>
#include <vector>

#include "index/Predicate.h"

namespace norvex {

using PredicateValue = std::variant<std::int64_t, double, std::string>;

// The values that the item has of an attribute; empty when it has none.
using AttributeReader = std::function<std::vector<PredicateValue>(std::string_view attribute)>;

// Whether the item matches. Calls `reader` any number of times.
bool matchesPredicate(const Predicate& predicate, const AttributeReader& reader);

}  // namespace norvex
