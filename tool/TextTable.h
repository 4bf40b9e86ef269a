// A table for people: its first column to the left, the others, of figures, to the right.
//
// Any thread. Pure but for the stream.
#pragma once

#include <array>
#include <string>
#include <vector>

#include "tool/Console.h"

namespace norvex {

class TextTable {
 public:
  using Row = std::array<std::string, 3>;

  // All texts are safe to be shown.
  TextTable(Row heading, std::vector<Row> rows);

  // A line a row. On a terminal that is too narrow each row takes two: the first column, and below it the
  // others, so that no figure is cut.
  void write(Console& console) const;

 private:
  using Widths = std::array<std::size_t, 3>;

  Widths widths() const;

  Row heading_;
  std::vector<Row> rows_;
};

}  // namespace norvex
