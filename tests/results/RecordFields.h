// Every field of the record by its name, for tests that do something with each of them.
#pragma once

#include <string>
#include <string_view>
#include <variant>
#include <vector>

#include "results/RecordField.h"

namespace norvex {

using FieldGetter = std::variant<TextGetter, FigureGetter, SettingGetter>;

struct RecordField {
  std::string_view name;
  FieldGetter getter;
  // Stores what `text` says: the text itself, a decimal number, or 1 or 0.
  void (*set)(NVXScannerResults& record, const std::string& text);
};

// In declaration order.
const std::vector<RecordField>& recordFields();

// The field's value in the form that RecordField::set takes; "(null)" for an absent text.
std::string fieldText(const RecordField& field, const NVXScannerResults& record);

// The field that the getter belongs to.
std::string_view fieldName(FieldGetter getter);

// The record of golden/record.txt, in which every figure has a value of its own.
NVXScannerResults fixedRecord();

}  // namespace norvex
