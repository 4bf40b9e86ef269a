#include "tool/SummaryCommand.h"

#include <utility>

#include "results/SummaryTable.h"
#include "tool/AgentScan.h"
#include "tool/Faults.h"
#include "tool/JsonText.h"

namespace norvex {
namespace {

// What a row shows, as JSON has it: bytes and counts as numbers, a setting as true or false, an absent text
// as null.
struct ExactValue {
  const NVXScannerResults& record;

  JsonDocument operator()(const form::EmptyLine&) const { return nullptr; }
  JsonDocument operator()(const form::ByteCount& value) const { return (record.*value.field)(); }
  JsonDocument operator()(const form::Digits& value) const { return (record.*value.field)(); }
  JsonDocument operator()(const form::SignedDigits& value) const { return (record.*value.field)(); }
  JsonDocument operator()(const form::OnOff& value) const { return (record.*value.field)(); }
  JsonDocument operator()(const form::AsItIs& value) const {
    const auto& text = (record.*value.field)();
    return text ? JsonDocument(*text) : JsonDocument(nullptr);
  }
};

JsonDocument linesAsJson(const NVXScannerResults& record) {
  JsonDocument lines = JsonDocument::array();
  for (const SummaryRow& row : summaryRows()) {
    if (std::holds_alternative<form::EmptyLine>(row.value)) continue;
    lines.push_back({{"label", row.label}, {"figure", std::visit(ExactValue{record}, row.value)}});
  }
  return lines;
}

}  // namespace

ExitStatus runSummary(ToolWorld& world, const SummaryRequest& request) {
  Faults faults(world.err);
  const auto record =
      scanAsAgent(world, faults, request.updateIndex ? IndexBeforeScan::update : IndexBeforeScan::leave);
  if (request.json) {
    world.out.stream() << jsonPage({{"version", kJsonVersion},
                                    {"figures", record ? linesAsJson(*record) : JsonDocument::array()},
                                    {"errors", faults.asJson()}});
  } else if (record != nullptr) {
    world.out.stream() << record->description();
  }
  return record == nullptr ? ExitStatus::failed : faults.status();
}

}  // namespace norvex
