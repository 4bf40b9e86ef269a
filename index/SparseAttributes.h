// The attributes that people and programs give to an item as extended attributes of its file.
//
// Used by the crawler, on any thread. Pure.
#pragma once

#include <optional>
#include <string_view>

#include "platform/MetadataIndex.h"

namespace norvex {

// The index's name for an extended attribute: "user.kMDItem..." and "user.com_brixo_..." without "user.".
// Nothing for all others, and for the attributes that the index itself gives to every item. A view into
// `extendedAttribute`.
std::optional<std::string_view> sparseAttributeName(std::string_view extendedAttribute);

// The value without the one line feed or zero byte that tools leave at its end.
std::string_view withoutTerminator(std::string_view value);

// The attribute's value, its terminator dropped: the number that it spells (NumberText.h), a 64-bit integer
// when it is whole and fits, else a double. All else is text, byte for byte, empty text included.
MetadataValue parseSparseValue(std::string_view value);

}  // namespace norvex
