// A diagnostic message as one line of JSON, the form in which every sink records it.
//
// A pure function; any thread.
#pragma once

#include <optional>
#include <span>
#include <string>
#include <string_view>

#include "platform/DiagnosticLog.h"

namespace norvex {

// {"domain":...,"level":...,"pairs":[["key","value"],...]} with the members and the pairs in this order, and
// "time" behind them when one is given. One line without its end. Bytes that are not UTF-8 stand as U+FFFD.
std::string diagnosticMessageJson(std::string_view domain, int level, std::span<const DiagnosticPair> pairs,
                                  std::optional<std::string_view> time = std::nullopt);

}  // namespace norvex
