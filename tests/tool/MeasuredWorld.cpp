#include "MeasuredWorld.h"

#include <time.h>

#include <cstdlib>
#include <vector>

namespace norvex {
namespace {

constexpr std::uint64_t kKilobyte = 1000, kMegabyte = 1000 * kKilobyte, kGigabyte = 1000 * kMegabyte;

constexpr const char* kOtherDisk = "/media/disk";

// "1234567" as "1_234_567": like no locale's, so that a figure that was not grouped shows.
std::string grouped(std::uint64_t number) {
  std::string text = std::to_string(number);
  for (std::size_t at = text.size(); at > 3;) text.insert(at -= 3, "_");
  return text;
}

std::vector<std::int64_t> gigabytes(std::vector<std::int64_t> sizes) {
  for (std::int64_t& size : sizes) size *= static_cast<std::int64_t>(kGigabyte);
  return sizes;
}

}  // namespace

MeasuredWorld::MeasuredWorld(const ConsoleStyle& style)
    : ScanWorld({"/", kOtherDisk}),
      out_(outText_, style),
      err_(errText_, style),
      world{.out = out_,
            .err = err_,
            .stores = stores_,
            .backupSettings = backupSettings,
            .byteCounts = byteCounts_,
            .digits = grouped,
            .clock = clock,
            .secondsSince1970 = [] { return kNow; },
            .isMountPoint = [](const std::string& path) { return path == "/" || path == kOtherDisk; },
            .absolute = [](const std::string& path) { return path; },
            .dataHome = cache_.path("data"),
            .messagesFile = cache_.path("diagnostics.jsonl"),
            .disabledFile = "/etc/norvex/disabled",
            .agentJournal = journal,
            .agentJob = job,
            .wakeWaitingAgent = [this] { return agentWaits; },
            .cancelled = cancelled_} {
  ::setenv("TZ", "UTC0", 1);
  ::tzset();
  fillStartupDisk();
  fillOtherDisk();
  backupSettings.content->automaticBackupsEnabled = true;
  backupSettings.content->destinations = {"/media/backup", "ssh://nas/backups"};
}

void MeasuredWorld::fillStartupDisk() {
  resourceValues.capacities["/"] = {{ResourceKey::VolumeTotalCapacity, 500 * kGigabyte},
                                    {ResourceKey::VolumeAvailableCapacity, 180 * kGigabyte}};
  volumeCatalog.countsOfVolume["/"] = {.files = 1'234'567, .folders = 89'012};
  // Messages, libraries, ..., movies, applications, databases, music, documents, images, ..., other.
  metadataIndex.volumes["/"].accumulatedSizes =
      gigabytes({2, 1, 4, 9, 1, 3, 120, 25, 1, 18, 2, 1, 60, 1, 1, 1, 0, 30});
  holds("/", images, "/Users/user/Pictures/Picara Library/a.jpg", 40 * kGigabyte);
  holds("/", images, "/Users/user/Pictures/b.jpg", 15 * kGigabyte);
  holds("/", images, "/Applications/Viewer.app/icon.png", 300 * kMegabyte);
  holds("/", images, "/Users/Shared/c.png", 4 * kGigabyte);
  holds("/", music, "/Users/user/Music/Sonpix/d.m4a", 5 * kGigabyte, true);
  holds("/", music, "/Users/user/Music/e.mp3", 13 * kGigabyte);
  holds("/", movies, "/Users/user/Music/Sonpix/f.m4v", 40 * kGigabyte, true);
  holds("/", movies, "/Users/user/Movies/g.mkv", 80 * kGigabyte);
  holds("/", virtualMachines, "/Users/user/h.vmdk", 9 * kGigabyte);
  holds("/", receipts, "/Applications/Bought.app", 7 * kGigabyte);
  holds("/", exclusions, "/Users/user/scratch", 3 * kGigabyte);
  putFile("/Users/user/Downloads/i.iso", 4'444'444'444);
  putFile("/Users/user/Desktop/j.txt", 1234);
}

void MeasuredWorld::fillOtherDisk() {
  resourceValues.capacities[kOtherDisk] = {{ResourceKey::VolumeTotalCapacity, 250 * kGigabyte},
                                           {ResourceKey::VolumeAvailableCapacity, 100 * kGigabyte}};
  volumeCatalog.countsOfVolume[kOtherDisk] = {.files = 4321, .folders = 210};
  metadataIndex.volumes[kOtherDisk].accumulatedSizes =
      gigabytes({0, 0, 20, 0, 0, 0, 90, 0, 0, 0, 0, 0, 35, 0, 0, 0, 0, 2});
  holds(kOtherDisk, images, "/media/disk/k.jpg", 35 * kGigabyte);
  holds(kOtherDisk, movies, "/media/disk/l.mkv", 90 * kGigabyte);
}

}  // namespace norvex
