#include "tool/SettingFindings.h"

#include <locale.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <clocale>
#include <cstdint>
#include <optional>
#include <string>

#include "index/ContentTypes.h"
#include "platform/Platform.h"
#include "tool/AgentSwitch.h"
#include "tool/FigureText.h"
#include "tool/SafeText.h"
#include "tool/Volumes.h"

namespace norvex {
namespace {

using State = Finding::State;

// Two weeks: an index that is older tells of a volume as it is no more.
constexpr std::int64_t kStale = 1'209'600;

// Why no file can be made in the folder, or "". A folder that has yet to be made must be possible to make:
// the nearest one above it counts.
std::string whyNotWritable(std::string folder) {
  while (folder.size() > 1 && ::access(folder.c_str(), F_OK) != 0)
    folder.resize(std::max<std::size_t>(folder.rfind('/'), 1));
  if (::access(folder.c_str(), W_OK | X_OK) == 0) return "";
  return safeText(folder) + ": " + systemError(errno).description;
}

bool isThere(const std::string& localeName) {
  const locale_t made = ::newlocale(LC_NUMERIC_MASK, localeName.c_str(), nullptr);
  if (made == nullptr) return false;
  ::freelocale(made);
  return true;
}

Finding freshness(const ToolWorld& world, const std::string& volume) {
  const auto store = StoreReader::open(world.stores, volume, StoreReader::Check::factsOnly);
  const std::string role = "Volume " + safeText(volume);
  if (!store) {
    return {role, State::fallsBack, "not indexed, so only its capacity is measured",
            "make the index with: " + updateCommand(volume)};
  }
  const std::int64_t age = world.secondsSince1970() - store.value()->healthCheck().value_or(0);
  if (age < kStale) return {role, State::works, "indexed " + ageText(age), ""};
  return {role, State::fallsBack, "indexed " + ageText(age) + ", and so out of date",
          "make the index anew with: " + updateCommand(volume)};
}

Finding volumeFinding(const ToolWorld& world, const std::string& volume,
                      const std::vector<NotReadyVolume>& notReady) {
  const auto found = std::find_if(notReady.begin(), notReady.end(),
                                  [&volume](const NotReadyVolume& each) { return each.root == volume; });
  if (found != notReady.end()) {
    // The message says what to do behind its last semicolon.
    const std::string& message = found->fault.message;
    const std::size_t end = message.rfind("; ");
    return {"Volume " + safeText(volume), State::broken, message.substr(0, end),
            end == std::string::npos ? "" : message.substr(end + 2)};
  }
  if (!world.isMountPoint(volume)) {
    return {"Volume " + safeText(volume), State::fallsBack, "nothing is mounted there, so it is not indexed",
            "mount it, or take it out of IncludedVolumes in chronel/backup.conf"};
  }
  return freshness(world, volume);
}

}  // namespace

Finding contentTypes(const Examined& examined) {
  const std::string role = "Content types";
  for (const auto& folder : ContentTypes::defaultMimeFolders(examined.world.dataHome)) {
    const std::string database = (folder / "globs2").string();
    if (::access(database.c_str(), R_OK) == 0)
      return {role, State::works, "the desktop's database " + safeText(database), ""};
  }
  return {role, State::fallsBack, "no database of file types; a small one that is built in is used",
          "install the package shared-mime-info"};
}

Finding hardwareModel(const Examined&) {
  const std::string role = "Hardware model";
  std::array<char, 64> name{};
  std::size_t length = name.size();
  if (platform().systemControl.sysctl(kHardwareModelName, name.data(), &length) == 0)
    return {role, State::works, safeText(name.data()), ""};
  return {role, State::fallsBack, "the machine does not tell its model; it is left out of the summary",
          "write HARDWARE_MODEL= into /etc/machine-info"};
}

Finding byteCounts(const Examined& examined) {
  const std::string role = "Byte counts";
  constexpr std::uint64_t kExample = 1'234'567'890;
  const std::string example = "written as " + examined.world.byteCounts.string(kExample);
  const std::string& name = examined.places.numbersLocale;
  if (isThere(name))
    return {role, State::works, example + ", as the locale " + safeText(name) + " has it", ""};
  return {role, State::fallsBack, example + ": there is no locale " + safeText(name) + " on this machine",
          "generate that locale, or choose another one with LANG"};
}

Finding preferences(const Examined& examined) {
  const std::string role = "Preferences";
  const std::string reported =
      thisReleaseHasReported() ? "this release has reported" : "this release has not reported yet";
  const std::string reason = whyNotWritable(examined.places.preferenceFolder);
  if (reason.empty()) return {role, State::works, reported, ""};
  return {role, State::fallsBack,
          reported + "; " + reason + "; that it has reported cannot be noted, so each run would report again",
          "make the folder writable for you"};
}

Finding installation(const Examined&) {
  return {"Installation", State::works,
          platform().installation.isInternalInstall()
              ? "internal: the figures of Desktop and Documents are reported, exactly"
              : "not internal: nothing of Desktop and Documents is reported",
          ""};
}

Finding indexFolder(const Examined& examined) {
  const std::string role = "Folder of the indexes";
  const std::string& folder = examined.world.stores.path();
  const std::string reason = whyNotWritable(folder);
  if (reason.empty()) return {role, State::works, safeText(folder), ""};
  return {role, State::broken, reason + "; no index can be made", "make the folder writable for you"};
}

Finding backupSettings(const Examined& examined) {
  const std::string role = "Backup settings";
  const std::string remedy = "name the volumes as IncludedVolumes in chronel/backup.conf, or auto";
  const auto volumes = chosenVolumes(examined.world, {});
  if (!volumes)
    return {role, State::broken, "there are none that can be used, so no volume is measured", remedy};
  if (volumes->empty()) return {role, State::broken, "they include no volume, so none is measured", remedy};
  return {role, State::works, countText(examined.world.digits, volumes->size(), "included volume"), ""};
}

std::vector<Finding> includedVolumes(const Examined& examined) {
  std::vector<Finding> findings;
  const auto notReady = volumesNotReady(examined.world);
  for (const std::string& volume : chosenVolumes(examined.world, {}).value_or(std::vector<std::string>()))
    findings.push_back(volumeFinding(examined.world, volume, notReady));
  return findings;
}

}  // namespace norvex
