// Where the space of this machine went, as a page for a browser.
//
// Any thread. Pure, but for the user's time zone.
#pragma once

#include <cstdint>
#include <string>

#include "platform/ByteCountFormatter.h"
#include "tool/StorageReport.h"

namespace norvex {

struct PageFacts {
  const ByteCountFormatter& byteCounts;
  std::int64_t measured = 0;  // seconds since 1970
};

// One HTML document (UTF-8) that needs nothing besides itself and forbids the browser to load anything. Every
// figure stands in it as text; the charts repeat them.
std::string storagePage(const StorageReport& report, const PageFacts& facts);

}  // namespace norvex
