// A platform on which a scan finds volumes that are ready, and the record of a scan as text.
#pragma once

#include <cstdint>
#include <initializer_list>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "results/NVXScannerResults.h"
#include "tests/support/TestPlatform.h"

namespace norvex {

// The seven queries of a volume, in their order.
enum Query { exclusions, receipts, images, music, movies, phoneApps, virtualMachines };

inline constexpr const char* queryPredicates[] = {
    "com_brixo_backup_excludeItem == 'com.brixo.backupd'",
    "kMDItemDovecartHasReceipt=1",
    "kMDItemContentTypeTree == 'public.image'",
    "kMDItemContentTypeTree == 'public.audio'",
    "kMDItemContentTypeTree == 'public.movie' || kMDItemContentTypeTree == 'public.video'",
    "kMDItemContentType == 'com.brixo.sonpix.ipa'",
    ("kMDItemContentType == 'com.vmware.vm-package' || "
     "kMDItemContentType == 'com.parallels.vm.vmpackage' || kMDItemKind == 'Virtual Disk Image'"),
};

// The home folder of "/Users/user" is there with everything that is measured in it, all empty; every volume
// has 1000 bytes, 600 of them in use.
class ScanWorld : public TestPlatform {
 public:
  explicit ScanWorld(std::vector<std::string> volumes = {"/"}, TestThreads threads = TestThreads::one);

  // Makes the file at `path` and a match of it.
  void holds(const std::string& volume, Query query, const std::string& path, std::uint64_t size,
             bool hasPurchaseDate = false);

  void putFile(const std::string& path, std::uint64_t size);
};

// Those figures of the record that are not 0 and whose names contain one of `parts`, in the record's order:
// "totalSize=600 userContentSize=600". "(no record)" when there is none.
std::string figures(const NVXScannerResults* record, std::initializer_list<std::string_view> parts);
std::string figures(const std::unique_ptr<NVXScannerResults>& record,
                    std::initializer_list<std::string_view> parts);

}  // namespace norvex
