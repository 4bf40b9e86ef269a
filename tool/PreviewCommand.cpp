#include "tool/PreviewCommand.h"

#include <string>
#include <string_view>
#include <vector>

#include "platform/Platform.h"
#include "results/ReportTables.h"
#include "tool/AgentScan.h"
#include "tool/Faults.h"
#include "tool/FigureText.h"
#include "tool/JsonText.h"
#include "tool/KeyPrefix.h"
#include "tool/TextTable.h"

namespace norvex {
namespace {

constexpr std::string_view kNotInternal =
    "this is no internal installation (there is no file /etc/norvex/internal-install)";

std::string_view keyPrefix(const ReportMessage& message) {
  std::vector<std::string_view> keys;
  for (const ReportRow& row : message.rows) keys.push_back(row.key);
  return commonKeyPrefix(keys);
}

bool isSize(const ReportRow& row) {
  return std::holds_alternative<encoding::Size>(row.value) ||
         std::holds_alternative<encoding::Difference>(row.value);
}

// Sizes that are differences wrap around below zero; no volume has 2^63 bytes.
bool isBelowZero(const ReportRow& row, const ExactFigure& figure) {
  constexpr std::uint64_t kLimit = std::uint64_t{1} << 63;
  const auto* number = std::get_if<std::uint64_t>(&figure);
  return number != nullptr && *number >= kLimit && isSize(row);
}

std::string figureText(const ToolWorld& world, const ReportRow& row, const ExactFigure& figure) {
  if (const auto* setting = std::get_if<bool>(&figure)) return *setting ? "yes" : "no";
  const std::uint64_t number = std::get<std::uint64_t>(figure);
  return isBelowZero(row, figure) ? "-" + world.digits(0 - number) : world.digits(number);
}

class PreviewText {
 public:
  PreviewText(ToolWorld& world, const NVXScannerResults& record) : world_(world), record_(record) {}

  void write(bool isInternal) {
    for (const ReportMessage& message : reportMessages()) {
      if (isInternal || !message.onlyOnInternalInstalls) {
        writeMessage(message);
      } else {
        writeNotSent(message);
      }
    }
    if (hasFigureBelowZero_) {
      out() << "A figure below zero: more was counted as bought than is counted in all.\n";
    }
    out() << "Nothing has been sent.\n";
  }

 private:
  std::ostream& out() { return world_.out.stream(); }

  void writeMessage(const ReportMessage& message) {
    const std::string_view prefix = keyPrefix(message);
    out() << world_.out.inked(Console::Ink::bold, message.domain) << ": "
          << countText(world_.digits, message.rows.size(), "figure") << ", level " << message.level << '\n';
    if (!prefix.empty()) out() << "Each key begins with " << prefix << '\n';
    out() << '\n';
    std::vector<TextTable::Row> rows;
    for (const ReportRow& row : message.rows) {
      const ExactFigure figure = exactFigure(row, record_);
      hasFigureBelowZero_ = hasFigureBelowZero_ || isBelowZero(row, figure);
      rows.push_back({std::string(row.key.substr(prefix.size())), figureText(world_, row, figure),
                      reportedText(row, record_)});
    }
    TextTable({"Key", "Exact figure", "Would be sent"}, std::move(rows)).write(world_.out);
    out() << '\n';
  }

  void writeNotSent(const ReportMessage& message) {
    out() << world_.out.inked(Console::Ink::bold, message.domain) << ": not sent, because " << kNotInternal
          << ".\nIt would tell " << countText(world_.digits, message.rows.size(), "exact figure")
          << " of the Desktop and Documents folders.\n\n";
  }

  ToolWorld& world_;
  const NVXScannerResults& record_;
  bool hasFigureBelowZero_ = false;
};

JsonDocument jsonOf(const ReportMessage& message, const NVXScannerResults& record) {
  JsonDocument pairs = JsonDocument::array();
  for (const ReportRow& row : message.rows) {
    JsonDocument pair;
    pair["key"] = row.key;
    std::visit([&pair](const auto& figure) { pair["figure"] = figure; }, exactFigure(row, record));
    pair["reported"] = reportedText(row, record);
    pairs.push_back(std::move(pair));
  }
  return {{"domain", message.domain}, {"level", message.level}, {"pairs", std::move(pairs)}};
}

void writeJson(ToolWorld& world, const NVXScannerResults* record, bool isInternal, const Faults& faults) {
  JsonDocument sent = JsonDocument::array(), notSent = JsonDocument::array();
  for (const ReportMessage& message : reportMessages()) {
    if (record == nullptr) break;
    if (isInternal || !message.onlyOnInternalInstalls) {
      sent.push_back(jsonOf(message, *record));
    } else {
      notSent.push_back({{"domain", message.domain}, {"reason", "notInternal"}, {"message", kNotInternal}});
    }
  }
  world.out.stream() << jsonPage({{"version", kJsonVersion},
                                  {"messages", std::move(sent)},
                                  {"notSent", std::move(notSent)},
                                  {"errors", faults.asJson()}});
}

}  // namespace

ExitStatus runPreview(ToolWorld& world, const PreviewRequest& request) {
  Faults faults(world.err);
  const auto record =
      scanAsAgent(world, faults, request.updateIndex ? IndexBeforeScan::update : IndexBeforeScan::leave);
  const bool isInternal = platform().installation.isInternalInstall();
  if (request.json) {
    writeJson(world, record.get(), isInternal, faults);
  } else if (record != nullptr) {
    PreviewText(world, *record).write(isInternal);
  }
  return record == nullptr ? ExitStatus::failed : faults.status();
}

}  // namespace norvex
