#include "tool/AgentScan.h"

#include <algorithm>
#include <string>
#include <vector>

#include "platform/Platform.h"
#include "scanner/NVXScanner.h"
#include "tool/IndexUpdater.h"
#include "tool/SafeText.h"
#include "tool/ScanProgress.h"
#include "tool/StopSignals.h"
#include "tool/Volumes.h"
#include "tool/WatchedMetadataIndex.h"
#include "tool/WatchedWalks.h"

namespace norvex {
namespace {

// The lines of a scan belong to whoever runs it. They are no failures of the command: the agent too goes on.
class ScanLog final : public SystemLog {
 public:
  ScanLog(Console& err, ScanProgress& progress) : err_(err), progress_(progress) {}

  void syslog(LogLevel, std::string_view message) override {
    progress_.makeRoom();
    err_.tell(safeText(message));
  }

 private:
  Console& err_;
  ScanProgress& progress_;
};

// The installed roles, but for those that are watched.
Platform watchedRoles(MetadataIndex& index, DirectoryEnumeration& walks, SystemLog& log) {
  const Platform& roles = platform();
  return {.activityScheduler = roles.activityScheduler,
          .backupSettings = roles.backupSettings,
          .byteCountFormatter = roles.byteCountFormatter,
          .clock = roles.clock,
          .diagnosticLog = roles.diagnosticLog,
          .directoryEnumeration = walks,
          .directoryListing = roles.directoryListing,
          .eventLoops = roles.eventLoops,
          .fileExistence = roles.fileExistence,
          .installation = roles.installation,
          .jobRegistry = roles.jobRegistry,
          .mediaMetadataReader = roles.mediaMetadataReader,
          .memoryPressureSource = roles.memoryPressureSource,
          .metadataIndex = index,
          .preferenceStore = roles.preferenceStore,
          .processControl = roles.processControl,
          .processMemoryInfo = roles.processMemoryInfo,
          .resourceValues = roles.resourceValues,
          .systemControl = roles.systemControl,
          .systemLog = log,
          .userFolders = roles.userFolders,
          .volumeCatalog = roles.volumeCatalog};
}

bool lacksHealthCheck(const std::string& volume) {
  const auto item = platform().metadataIndex.itemAtPath(volume);
  return item != nullptr && !item->valueForAttribute(kMDStoreLastHealthCheck).has_value();
}

class AgentScan {
 public:
  AgentScan(ToolWorld& world, Faults& faults)
      : world_(world), faults_(faults), volumes_(NVXScanner().includedVolumes()) {}

  void updateIndexes() {
    const StopSignals stoppable;
    IndexUpdater updater(world_, faults_);
    for (const std::string& volume : chosenVolumes(world_, {}).value_or(std::vector<std::string>())) {
      if (isPlainFolder(volume)) continue;  // the scan is going to be refused, and why is told then
      updater.update(volume);
    }
  }

  std::unique_ptr<NVXScannerResults> scan() {
    if (volumes().empty()) {
      world_.err.tell(
          "the backup settings include no volume, so only fixed folders are measured; name the volumes as "
          "IncludedVolumes in chronel/backup.conf");
    }
    ScanProgress progress(world_, volumes().size());
    auto record = watchedScan(progress);
    progress.makeRoom();
    if (record == nullptr) tellRefusal(progress.refused());
    return record;
  }

 private:
  const std::vector<std::string>& volumes() const {
    static const std::vector<std::string> none;
    return volumes_ ? *volumes_ : none;
  }

  std::unique_ptr<NVXScannerResults> watchedScan(ScanProgress& progress) {
    ScanLog log(world_.err, progress);
    WatchedMetadataIndex index(platform().metadataIndex, progress);
    WatchedWalks walks(platform().directoryEnumeration, [&progress] { progress.itemIsWalked(); });
    const Platform roles = watchedRoles(index, walks, log);
    const ScopedPlatform installed(roles);
    return NVXScanner().scan();
  }

  bool isPlainFolder(const std::string& volume) const {
    return !world_.isMountPoint(volume) && lacksHealthCheck(volume) &&
           volumeOf(world_, normalizedPath(volume)) != normalizedPath(volume);
  }

  void tellRefusal(const std::vector<std::string>& refused) {
    for (const std::string& volume : volumes()) {
      if (isPlainFolder(volume)) {
        faults_.add(volume, plainFolderFault(volumeOf(world_, normalizedPath(volume))));
      } else if (lacksHealthCheck(volume)) {
        faults_.add(volume, unfinishedFault(volume));
      }
    }
    for (const std::string& volume : refused) tellUnsearchable(volume);
  }

  void tellUnsearchable(const std::string& volume) {
    const auto store = openStore(world_.stores, normalizedPath(volume));
    if (const auto* fault = std::get_if<StoreFault>(&store)) return faults_.add(volume, *fault);
    faults_.add(volume, "failed",
                "the agent reports nothing: a query over this volume's index does not start; make the index "
                "anew with: " +
                    updateCommand(volume));
  }

  ToolWorld& world_;
  Faults& faults_;
  const std::optional<std::vector<std::string>> volumes_;
};

}  // namespace

std::unique_ptr<NVXScannerResults> scanAsAgent(ToolWorld& world, Faults& faults, IndexBeforeScan index) {
  AgentScan scan(world, faults);
  if (index == IndexBeforeScan::update) scan.updateIndexes();
  if (world.cancelled) return nullptr;  // a fault, and told
  return scan.scan();
}

}  // namespace norvex
