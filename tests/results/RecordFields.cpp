#include "RecordFields.h"

#include <sstream>
#include <stdexcept>

#include "GoldenFile.h"

namespace norvex {
namespace {

std::string textOf(const std::shared_ptr<const std::string>& value) {
  return value ? *value : "(null)";
}

std::string textOf(std::uint64_t value) {
  return std::to_string(value);
}

}  // namespace

#define NVX_TEXT(name, setName)                                                         \
  {#name, &NVXScannerResults::name, [](NVXScannerResults& r, const std::string& text) { \
     r.setName(std::make_shared<const std::string>(text));                              \
   }},
#define NVX_FIGURE(name, setName)   \
  {#name, &NVXScannerResults::name, \
   [](NVXScannerResults& r, const std::string& text) { r.setName(std::stoull(text)); }},
#define NVX_SETTING(name, setName)  \
  {#name, &NVXScannerResults::name, \
   [](NVXScannerResults& r, const std::string& text) { r.setName(text == "1"); }},
const std::vector<RecordField>& recordFields() {
  static const std::vector<RecordField> fields = {
#include "results/NVXScannerResultsFields.def"
  };
  return fields;
}
#undef NVX_TEXT
#undef NVX_FIGURE
#undef NVX_SETTING

std::string fieldText(const RecordField& field, const NVXScannerResults& record) {
  return std::visit([&](auto getter) { return textOf((record.*getter)()); }, field.getter);
}

std::string_view fieldName(FieldGetter getter) {
  for (const RecordField& field : recordFields()) {
    if (field.getter == getter) return field.name;
  }
  throw std::logic_error("a getter of no field");
}

NVXScannerResults fixedRecord() {
  NVXScannerResults record;
  std::istringstream lines(readGolden("record.txt"));
  for (const RecordField& field : recordFields()) {
    std::string line;
    std::getline(lines, line);
    const auto equals = line.find('=');
    if (line.substr(0, equals) != field.name) throw std::logic_error("not the line of the field: " + line);
    field.set(record, line.substr(equals + 1));
  }
  return record;
}

}  // namespace norvex
