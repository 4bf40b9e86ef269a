#include "tests/scanner/ScanWorld.h"

#include <algorithm>
#include <utility>

namespace norvex {

ScanWorld::ScanWorld(std::vector<std::string> volumes, TestThreads threads) : TestPlatform(threads) {
  files.put("/Users/user", folder("Downloads"));
  files.put("/Users/user", folder("Desktop"));
  files.put("/Users/user", folder("Documents"));
  files.put("/Users/user/Library/Application Support/Handlink", folder("Backup"));
  resourceValues.capacities["/"] = {};
  for (const std::string& volume : volumes) {
    metadataIndex.volumes[volume] = {};
    volumeCatalog.countsOfVolume[volume] = {};
  }
  for (const std::string& volume : volumes) {
    resourceValues.capacities[volume] = {{ResourceKey::VolumeTotalCapacity, 1000},
                                         {ResourceKey::VolumeAvailableCapacity, 400}};
  }
  backupSettings.content.emplace();
  backupSettings.content->includedVolumes = std::move(volumes);
}

void ScanWorld::holds(const std::string& volume, Query query, const std::string& path, std::uint64_t size,
                      bool hasPurchaseDate) {
  putFile(path, size);
  metadataIndex.volumes[volume].matches[queryPredicates[query]].push_back({path, hasPurchaseDate});
}

void ScanWorld::putFile(const std::string& path, std::uint64_t size) {
  const std::size_t nameBegin = path.rfind('/') + 1;
  files.put(path.substr(0, nameBegin), file(path.substr(nameBegin), size));
}

std::string figures(const NVXScannerResults* record, std::initializer_list<std::string_view> parts) {
  if (record == nullptr) return "(no record)";
  std::string text;
  const auto append = [&](std::string_view name, std::uint64_t value) {
    const bool isWanted = std::any_of(parts.begin(), parts.end(), [&](std::string_view part) {
      return name.find(part) != std::string_view::npos;
    });
    if (value == 0 || !isWanted) return;
    if (!text.empty()) text += ' ';
    text += std::string(name) + "=" + std::to_string(value);
  };
#define NVX_TEXT(name, setName)
#define NVX_FIGURE(name, setName) append(#name, record->name());
#define NVX_SETTING(name, setName) append(#name, record->name() ? 1 : 0);
#include "results/NVXScannerResultsFields.def"
#undef NVX_TEXT
#undef NVX_FIGURE
#undef NVX_SETTING
  return text;
}

std::string figures(const std::unique_ptr<NVXScannerResults>& record,
                    std::initializer_list<std::string_view> parts) {
  return figures(record.get(), parts);
}

}  // namespace norvex
