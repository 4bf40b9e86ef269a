#include "tool/IndexStatusCommand.h"

#include <sys/stat.h>

#include <algorithm>
#include <vector>

#include "tool/Faults.h"
#include "tool/FigureText.h"
#include "tool/JsonText.h"
#include "tool/SafeText.h"
#include "tool/SizeBars.h"
#include "tool/StoragePositionNames.h"
#include "tool/Volumes.h"

namespace norvex {
namespace {

struct VolumeStatus {
  std::string root;
  std::int64_t updated = 0;  // seconds since 1970
  StoreCounts counts;
  AccumulatedSizes::Values sizes{};
  std::uint64_t storeBytes = 0;
};

VolumeStatus statusOf(const StoreFolder& stores, const StoreReader& store) {
  struct stat file {};
  const bool hasFile = ::stat(stores.storePath(store.root()).c_str(), &file) == 0;
  return {store.root(), store.healthCheck().value_or(0), store.counts().value_or(StoreCounts()),
          store.accumulatedSizes().value_or(AccumulatedSizes::Values()),
          hasFile ? static_cast<std::uint64_t>(file.st_size) : 0};
}

// The positions that hold anything, the largest first.
std::vector<SizeBar> barsOf(const AccumulatedSizes::Values& sizes) {
  std::vector<SizeBar> bars;
  for (std::size_t at = 0; at < sizes.size(); ++at) {
    if (sizes[at] > 0)
      bars.push_back({kStoragePositionNames[at].label, static_cast<std::uint64_t>(sizes[at])});
  }
  std::stable_sort(bars.begin(), bars.end(),
                   [](const SizeBar& a, const SizeBar& b) { return a.bytes > b.bytes; });
  return bars;
}

void writeText(ToolWorld& world, const VolumeStatus& status) {
  Console& out = world.out;
  const StoreCounts& counts = status.counts;
  const auto label = [&out](const char* text) { return "  " + out.inked(Console::Ink::dim, text); };
  out.stream() << out.inked(Console::Ink::bold, safeText(status.root)) << '\n'
               << label("Updated     ") << localTime(status.updated) << " ("
               << ageText(world.secondsSince1970() - status.updated) << ")\n"
               << label("Items       ") << world.digits(counts.files + counts.folders) << " ("
               << countText(world.digits, counts.files, "file") << ", "
               << countText(world.digits, counts.folders, "folder") << ")\n"
               << label("Unreadable  ") << world.digits(counts.unreadable) << '\n'
               << label("Index       ") << world.byteCounts.string(status.storeBytes) << "\n\n";
  writeSizeBars(out, world.byteCounts, barsOf(status.sizes));
}

JsonDocument jsonOf(const VolumeStatus& status) {
  JsonDocument entry, sizes;
  setText(entry, "root", status.root);
  entry["updated"] = utcTime(status.updated);
  entry["items"] = status.counts.files + status.counts.folders;
  entry["files"] = status.counts.files;
  entry["folders"] = status.counts.folders;
  entry["unreadable"] = status.counts.unreadable;
  entry["storeBytes"] = status.storeBytes;
  for (std::size_t at = 0; at < status.sizes.size(); ++at)
    sizes[kStoragePositionNames[at].key] = status.sizes[at];
  entry["sizes"] = std::move(sizes);
  return entry;
}

}  // namespace

ExitStatus runIndexStatus(ToolWorld& world, const IndexStatusRequest& request) {
  Faults faults(world.err);
  JsonDocument entries = JsonDocument::array();
  bool isFirst = true;
  for (const std::string& volume :
       chosenVolumes(world, request.volumes).value_or(std::vector<std::string>{"/"})) {
    const auto store = openStore(world.stores, volume);
    if (const auto* fault = std::get_if<StoreFault>(&store)) {
      faults.add(volume, *fault);
      continue;
    }
    const VolumeStatus status = statusOf(world.stores, *std::get<0>(store));
    if (request.json) {
      entries.push_back(jsonOf(status));
      continue;
    }
    if (!isFirst) world.out.stream() << '\n';
    isFirst = false;
    writeText(world, status);
  }
  if (request.json) {
    world.out.stream() << jsonPage(
        {{"version", kJsonVersion}, {"volumes", std::move(entries)}, {"errors", faults.asJson()}});
  }
  return faults.status();
}

}  // namespace norvex
