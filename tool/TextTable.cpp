#include "tool/TextTable.h"

#include <algorithm>
#include <numeric>
#include <utility>

#include "tool/SafeText.h"

namespace norvex {
namespace {

constexpr std::size_t kIndent = 2, kGap = 2;

std::string spaces(std::size_t count) {
  return std::string(count, ' ');
}

std::string toTheRight(const std::string& text, std::size_t columns) {
  return spaces(columns - columnsOf(text)) + text;
}

}  // namespace

TextTable::TextTable(Row heading, std::vector<Row> rows)
    : heading_(std::move(heading)), rows_(std::move(rows)) {}

TextTable::Widths TextTable::widths() const {
  Widths widths{};
  const auto widen = [&widths](const Row& row) {
    for (std::size_t at = 0; at < row.size(); ++at) widths[at] = std::max(widths[at], columnsOf(row[at]));
  };
  widen(heading_);
  for (const Row& row : rows_) widen(row);
  return widths;
}

void TextTable::write(Console& console) const {
  const Widths columns = widths();
  const std::size_t needed =
      kIndent + std::accumulate(columns.begin(), columns.end(), 2 * kGap, std::plus<>());
  const bool isNarrow = console.style().isTerminal && needed > console.style().width;
  const std::string between = isNarrow ? "\n" + spaces(2 * kIndent) : spaces(kGap);
  const auto line = [&](const Row& row) {
    const std::size_t rest = isNarrow ? 0 : columns[0] - columnsOf(row[0]);
    return spaces(kIndent) + row[0] + spaces(rest) + between + toTheRight(row[1], columns[1]) + spaces(kGap) +
           toTheRight(row[2], columns[2]);
  };
  console.stream() << console.inked(Console::Ink::dim, line(heading_)) << '\n';
  for (const Row& row : rows_) console.stream() << line(row) << '\n';
}

}  // namespace norvex
