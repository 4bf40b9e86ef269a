// The scanner on the roles of Linux, for measuring its walks as the agent makes them.
#pragma once

#include "index/StoredMetadataIndex.h"
#include "platform/Platform.h"
#include "platform/linux/LinuxPlatform.h"
#include "scanner/NVXScanner.h"

namespace norvex::bench {

class MeasuredScanner {
 public:
  MeasuredScanner() : linux_(0, nullptr, processEnvironment()) {}

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
  LinuxPlatform linux_;
  VolumeStores stores_{StoreFolder(linux_.folders().cache + "/norvex")};
  StoredMetadataIndex index_{stores_, linux_.eventLoops()};
  const Platform roles_ = linux_.roles(index_, linux_.volumeCatalog());
  const ScopedPlatform installed_{roles_};
  NVXScanner scanner_;
};

}  // namespace norvex::bench
