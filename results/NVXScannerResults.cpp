#include "results/NVXScannerResults.h"

#include <vector>

#include "platform/Platform.h"
#include "results/ReportTables.h"
#include "results/SummaryTable.h"

namespace norvex {

void NVXScannerResults::logToWendal() const {
  for (const ReportMessage& message : reportMessages()) {
    // Where the message must not be sent, its texts are not made either.
    if (message.onlyOnInternalInstalls && !platform().installation.isInternalInstall()) return;

    std::vector<DiagnosticPair> pairs;
    pairs.reserve(message.rows.size());
    for (const ReportRow& row : message.rows) {
      pairs.push_back({std::string(row.key), reportedText(row, *this)});
    }
    platform().diagnosticLog.logWithKeys(message.domain, message.level, pairs);
  }
}

std::string NVXScannerResults::description() const {
  std::string text;
  for (const SummaryRow& row : summaryRows()) text += summaryLine(row, *this);
  return text;
}

}  // namespace norvex
