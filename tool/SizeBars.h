// A volume's accumulated sizes as lines of a label, a size and a bar, the largest first.
//
// Any thread. Pure but for the stream.
#pragma once

#include "index/AccumulatedSizes.h"
#include "platform/ByteCountFormatter.h"
#include "tool/Console.h"

namespace norvex {

// No line is longer than the console is wide. Positions without bytes are left out; the longest bar stands
// for the largest size.
void writeSizeBars(Console& console, const ByteCountFormatter& byteCounts,
                   const AccumulatedSizes::Values& sizes);

}  // namespace norvex
