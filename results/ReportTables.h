// The three diagnostic messages as tables: which field feeds which key, and how its value becomes text.
//
// Used by the record's report, and by programs that show people beforehand what a report would say. Constant
// data and pure functions; on any thread.
#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <variant>

#include "results/RecordField.h"

namespace norvex {

// How a value becomes text, and the field that it is taken from.
namespace encoding {
// The upper bound of the bucket that holds the size.
struct Size {
  FigureGetter field;
};
// The count with its two leading digits.
struct Count {
  FigureGetter field;
};
// The bucket of minuend - subtrahend. Below zero the difference wraps around, and its text is the negative
// figure that every size near 2^64 has.
struct Difference {
  FigureGetter minuend;
  FigureGetter subtrahend;
};
// "1" or "0".
struct Boolean {
  SettingGetter field;
};
// The field's 64 bits read as a signed number: negative from 2^63 on.
struct SignedDecimal {
  FigureGetter field;
};
// The figure itself.
struct Exact {
  FigureGetter field;
};
}  // namespace encoding

using EncodedValue = std::variant<encoding::Size, encoding::Count, encoding::Difference, encoding::Boolean,
                                  encoding::SignedDecimal, encoding::Exact>;

struct ReportRow {
  std::string_view key;
  EncodedValue value;
};

struct ReportMessage {
  std::string_view domain;
  // As of syslog.
  int level;
  std::span<const ReportRow> rows;
  bool onlyOnInternalInstalls;
};

// The messages of a report in the order in which they are sent: sizes, object counts, and the exact figures
// of the Desktop and Documents folders, which is the only one that is kept to internal installations.
std::span<const ReportMessage> reportMessages();

// The text that stands for the row's value in the message. Never empty.
std::string reportedText(const ReportRow& row, const NVXScannerResults& record);

// What the text is made from: the field's value, or the difference, wrapped around below zero.
using ExactFigure = std::variant<std::uint64_t, bool>;
ExactFigure exactFigure(const ReportRow& row, const NVXScannerResults& record);

}  // namespace norvex
