#include "tool/ShowCommand.h"

#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>

#include "platform/linux/FileReplacement.h"
#include "scanner/NVXScanner.h"
#include "tool/AgentScan.h"
#include "tool/Faults.h"
#include "tool/JsonText.h"
#include "tool/SafeText.h"
#include "tool/SizeBars.h"
#include "tool/StoragePage.h"
#include "tool/StorageReport.h"
#include "tool/WrappedText.h"

namespace norvex {
namespace {

constexpr std::size_t kVolumeBarColumns = 40;

// Wide enough for every label, so that all groups stand in line.
constexpr std::size_t kLabelColumns = 23;

class ShowText {
 public:
  ShowText(ToolWorld& world, const StorageReport& report) : world_(world), report_(report) {}

  void write() {
    writeHeading("Volumes");
    for (const VolumeSpace& volume : report_.volumes) writeVolume(volume);
    writeGroup(report_.categories);
    for (const SizeGroup& kind : report_.media) writeGroup(kind);
    writeGroup(report_.purchases);
    writeGroup(report_.places);
  }

 private:
  std::ostream& out() { return world_.out.stream(); }

  void writeHeading(std::string_view title) { out() << world_.out.inked(Console::Ink::bold, title) << '\n'; }

  void writeVolume(const VolumeSpace& volume) {
    const auto text = [this](std::uint64_t bytes) { return world_.byteCounts.string(bytes); };
    out() << "  " << safeText(volume.root) << "  " << text(volume.used) << " of " << text(volume.capacity)
          << " in use, " << text(volume.free()) << " free\n";
    const std::size_t columns = std::min(world_.out.style().width - 4, kVolumeBarColumns);
    out() << "  " << fillBar(world_.out, columns, volume.used, volume.capacity) << '\n';
  }

  void writeGroup(const SizeGroup& group) {
    out() << '\n';
    writeHeading(group.title);
    std::vector<SizeBar> bars;
    for (const LabelledSize& size : group.largestFirst())
      bars.push_back({std::string(size.label), size.bytes});
    if (bars.empty()) {
      out() << "  " << world_.out.inked(Console::Ink::dim, "nothing") << '\n';
      return;
    }
    writeSizeBars(world_.out, world_.byteCounts, bars, kLabelColumns);
    for (const std::string& line : wrappedText(group.note, world_.out.style().width - 2))
      out() << "  " << world_.out.inked(Console::Ink::dim, line) << '\n';
  }

  ToolWorld& world_;
  const StorageReport& report_;
};

JsonDocument jsonOf(const SizeGroup& group) {
  JsonDocument sizes = JsonDocument::object();
  for (const LabelledSize& size : group.sizes) sizes[std::string(size.key)] = size.bytes;
  return sizes;
}

void writeJson(ToolWorld& world, const std::optional<StorageReport>& report, const Faults& faults) {
  JsonDocument document{{"version", kJsonVersion}, {"volumes", JsonDocument::array()}};
  if (report) {
    for (const VolumeSpace& volume : report->volumes) {
      JsonDocument entry;
      setText(entry, "root", volume.root);
      entry["capacity"] = volume.capacity;
      entry["used"] = volume.used;
      entry["free"] = volume.free();
      document["volumes"].push_back(std::move(entry));
    }
    document["categories"] = jsonOf(report->categories);
    for (const SizeGroup& kind : report->media) document["media"][std::string(kind.key)] = jsonOf(kind);
    document["purchases"] = jsonOf(report->purchases);
    document["places"] = jsonOf(report->places);
  }
  document["errors"] = faults.asJson();
  world.out.stream() << jsonPage(document);
}

// Why nothing could be written at the path, as far as that can be told beforehand; 0 when it seems that it
// can be. A measurement that takes minutes must not end with a folder that is not there.
int obstacleAt(const std::string& path) {
  struct stat status {};
  // A device or a pipe would be replaced by a file.
  if (::stat(path.c_str(), &status) == 0 && !S_ISREG(status.st_mode))
    return S_ISDIR(status.st_mode) ? EISDIR : EINVAL;
  const std::string folder = path.substr(0, path.rfind('/') + 1);
  return ::access(folder.c_str(), W_OK | X_OK) == 0 ? 0 : errno;
}

void tellUnwritten(Faults& faults, const std::string& path, int error) {
  faults.add(path, "failed",
             "the page was not written: " + systemError(error).description +
                 "; name a file in a folder that you may write to");
}

ExitStatus writePage(ToolWorld& world, const std::string& path, const StorageReport& report, Faults& faults) {
  const std::string page = storagePage(report, {world.byteCounts, world.secondsSince1970()});
  if (const int error = FileReplacement(path).commit(page)) {
    tellUnwritten(faults, path, error);
  } else {
    world.out.stream() << "Written: " << safeText(path) << '\n';
  }
  return faults.status();
}

}  // namespace

ExitStatus runShow(ToolWorld& world, const ShowRequest& request) {
  Faults faults(world.err);
  std::string page;
  if (request.htmlFile) {
    page = world.absolute(*request.htmlFile);
    if (const int error = obstacleAt(page)) {
      tellUnwritten(faults, page, error);
      return ExitStatus::failed;
    }
  }
  const auto record =
      scanAsAgent(world, faults, request.updateIndex ? IndexBeforeScan::update : IndexBeforeScan::leave);
  std::optional<StorageReport> report;
  if (record)
    report = storageReport(*record, NVXScanner().includedVolumes().value_or(std::vector<std::string>()));
  if (request.json) writeJson(world, report, faults);
  if (!report) return ExitStatus::failed;
  if (request.htmlFile) return writePage(world, page, *report, faults);
  if (!request.json) ShowText(world, *report).write();
  return faults.status();
}

}  // namespace norvex
