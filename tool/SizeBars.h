// Sizes as lines of a label, a size and a bar.
//
// Any thread. Pure but for the stream.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "platform/ByteCountFormatter.h"
#include "tool/Console.h"

namespace norvex {

struct SizeBar {
  std::string label;  // safe to be shown
  std::uint64_t bytes = 0;
};

// A line each, in this order; the longest bar stands for the largest size. No line is longer than the console
// is wide. `labelColumns`: how wide the labels are at least, so that several groups stand in line.
void writeSizeBars(Console& console, const ByteCountFormatter& byteCounts, const std::vector<SizeBar>& bars,
                   std::size_t labelColumns = 0);

// A bar of so many columns, filled to `part` of `whole`: "[####    ]", in block letters where the console has
// them.
std::string fillBar(const Console& console, std::size_t columns, std::uint64_t part, std::uint64_t whole);

}  // namespace norvex
