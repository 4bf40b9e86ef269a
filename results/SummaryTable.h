// The summary as a table: the label of each line, the field that it shows, and the form of the value.
//
// Used by the record's description and by programs that show single lines of it. Constant data and pure
// functions but for the byte-count formatter, which is the installed one; on any thread.
#pragma once

#include <span>
#include <string>
#include <string_view>
#include <variant>

#include "results/RecordField.h"

namespace norvex {

// How a value is shown to people, and the field that it is taken from.
namespace form {
// Separates two groups; has no label and no value.
struct EmptyLine {};
// In the user's words for file sizes ("1.5 MB").
struct ByteCount {
  FigureGetter field;
};
struct Digits {
  FigureGetter field;
};
// The field's 64 bits read as a signed number: negative from 2^63 on.
struct SignedDigits {
  FigureGetter field;
};
struct OnOff {
  SettingGetter field;
};
// Unchanged; "(null)" when it is absent.
struct AsItIs {
  TextGetter field;
};
}  // namespace form

using ShownValue = std::variant<form::EmptyLine, form::ByteCount, form::Digits, form::SignedDigits,
                                form::OnOff, form::AsItIs>;

struct SummaryRow {
  std::string_view label;
  ShownValue value;
};

// The 92 lines in order, 12 of them empty.
std::span<const SummaryRow> summaryRows();

// The line of the row with its line feed: "label: value\n", or "\n" alone.
std::string summaryLine(const SummaryRow& row, const NVXScannerResults& record);

}  // namespace norvex
