// The identities that the journal knows the kinds of diagnostic messages by: what a person or a catalog of
// explanations finds all of one kind with.
//
// Constants; never to be changed or used for anything else.
#pragma once

#include <array>
#include <string_view>

namespace norvex {

struct DiagnosticMessageId {
  std::string_view domain;
  std::string_view id;  // 128 random bits
};

inline constexpr std::array<DiagnosticMessageId, 3> kDiagnosticMessageIds{{
    {"com.brixo.norvex.run2", "3d3c8faa00f14245afe45c1dcbb559ff"},
    {"com.brixo.norvex.filecounts.run3", "c9192c2abfed4c47a1f4a7c6539f1953"},
    {"com.brixo.norvex.directoryinfo.run4", "783464920c0240cca9d0f97aa6f9a503"},
}};

// Empty for a domain that has none.
constexpr std::string_view diagnosticMessageId(std::string_view domain) {
  for (const DiagnosticMessageId& row : kDiagnosticMessageIds) {
    if (row.domain == domain) return row.id;
  }
  return {};
}

}  // namespace norvex
