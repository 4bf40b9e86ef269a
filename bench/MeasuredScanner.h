// The scanner on the roles of Linux, for measuring its walks as the agent makes them.
#pragma once

#include "machine/MachinePlatform.h"
#include "platform/linux/SyslogSystemLog.h"
#include "scanner/NVXScanner.h"

namespace norvex::bench {

class MeasuredScanner {
 public:
  MeasuredScanner() : machine_(0, nullptr, processEnvironment(), systemLog_) {}

  std::uint64_t sizeOf(const Location& folder) { return scanner_.sizeForDirectory(folder); }

  struct Detail {
    std::uint64_t packages = 0;
    std::uint64_t folders = 0;
    std::uint64_t files = 0;
    std::uint64_t bytes = 0;
    std::uint64_t deepest = 0;
  };

  Detail detailOf(const Location& folder) {
    Detail detail;
    const auto reach = [&](std::uint64_t depth) { detail.deepest = std::max(detail.deepest, depth); };
    scanner_.scanDirectoryInDetail(
        folder,
        [&](const Location&, std::uint64_t depth) {
          ++detail.packages;
          reach(depth);
        },
        [&](const Location&, std::uint64_t depth) {
          ++detail.folders;
          reach(depth);
        },
        [&](const Location&, std::uint64_t depth, std::optional<std::uint64_t> size) {
          ++detail.files;
          detail.bytes += size.value_or(0);
          reach(depth);
        });
    return detail;
  }

 private:
  SyslogSystemLog systemLog_;
  MachinePlatform machine_;
  const ScopedPlatform installed_{machine_.roles()};
  NVXScanner scanner_;
};

}  // namespace norvex::bench
