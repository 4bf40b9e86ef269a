// The value of an attribute as people read it.
//
// Any thread. Pure, but for the user's time zone.
#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "platform/ByteCountFormatter.h"
#include "platform/MetadataIndex.h"

namespace norvex {

// The lines of the value, at least one; safe to be shown on a terminal.
std::vector<std::string> attributeLines(std::string_view name, const MetadataValue& value,
                                        const ByteCountFormatter& byteCounts);

}  // namespace norvex
