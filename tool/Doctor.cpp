#include "tool/Doctor.h"

#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>

#include "index/ContentTypes.h"
#include "platform/FileDescriptor.h"
#include "platform/Platform.h"
#include "platform/linux/KernelMemoryPressureSource.h"
#include "platform/linux/PressureTriggers.h"
#include "tool/AgentSwitch.h"
#include "tool/FigureText.h"
#include "tool/MeasuringFindings.h"
#include "tool/SafeText.h"
#include "tool/Volumes.h"

namespace norvex {
namespace {

using State = Finding::State;

// Two weeks: an index that is older tells of a volume as it is no more.
constexpr std::int64_t kStale = 1'209'600;

// Whether somebody listens at a datagram socket: 0, or the errno value. Nothing is sent.
int listenerAt(const std::string& path) {
  sockaddr_un address{};
  address.sun_family = AF_UNIX;
  if (path.size() >= sizeof address.sun_path) return ENAMETOOLONG;
  std::memcpy(address.sun_path, path.c_str(), path.size() + 1);
  const FileDescriptor socket(::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0));
  if (!socket) return errno;
  const auto* generic = reinterpret_cast<const sockaddr*>(&address);
  return ::connect(socket.number(), generic, sizeof address) == 0 ? 0 : errno;
}

std::string reasonOf(int error) {
  return systemError(error).description;
}

Finding diagnosticLog(const ToolWorld& world, const DoctorPlaces& places) {
  const std::string role = "Diagnostic log";
  const int error = listenerAt(places.journalSocket);
  if (error == 0) return {role, State::works, "the system's journal", ""};
  return {role, State::fallsBack,
          "no journal listens at " + places.journalSocket + " (" + reasonOf(error) +
              "); messages go to the file " + safeText(world.messagesFile),
          "start systemd-journald, if messages are to be collected"};
}

Finding reportedMessagesLog(const ToolWorld& world) {
  const std::string role = "Reading of what was reported";
  const auto entries = world.agentJournal.entriesSince(world.secondsSince1970());
  if (entries) return {role, State::works, "the journal can be read", ""};
  return {role, State::fallsBack, entries.error().description + "; only the agent's own file is read",
          "become a member of the group systemd-journal"};
}

Finding systemLog(const DoctorPlaces& places) {
  const std::string role = "System log";
  const int error = listenerAt(places.systemLogSocket);
  if (error == 0) return {role, State::works, "the system log at " + places.systemLogSocket, ""};
  return {role, State::fallsBack,
          "nobody listens at " + places.systemLogSocket + " (" + reasonOf(error) +
              "); the agent's lines about failures are lost",
          "start systemd-journald or another system log"};
}

Finding serviceManager(const ToolWorld& world) {
  const std::string role = "Service manager";
  const auto state = world.agentJob.state();
  if (!state) {
    return {role, State::broken, state.error().description + "; the agent does not run by itself",
            state.error().code == ENOENT ? "install the package with the agent's job"
                                         : "log in to a session that systemd manages"};
  }
  const AgentSwitch agentSwitch = agentSwitchOf(world, state.value());
  return {role, State::works,
          agentSwitch.isOn ? "the agent's job is on" : "the agent's job is off: " + agentSwitch.explanation,
          ""};
}

Finding memoryPressure(const DoctorPlaces& places) {
  const std::string role = "Memory pressure";
  std::string refused;
  for (const std::string& file : places.pressureFiles) {
    const auto triggers = PressureTriggers::onFile(file, {.warning = true, .critical = true});
    if (triggers) return {role, State::works, "triggers of the kernel at " + safeText(file), ""};
    refused += (refused.empty() ? "" : ", ") + safeText(file) + ": " + triggers.error().description;
  }
  return {role, State::fallsBack,
          "no trigger of the kernel (" + (refused.empty() ? "it has no files of pressure" : refused) +
              "); the agent looks every few seconds how much memory is left",
          "boot the kernel with psi=1, if it can"};
}

Finding contentTypes(const ToolWorld& world) {
  const std::string role = "Content types";
  for (const auto& folder : ContentTypes::defaultMimeFolders(world.dataHome)) {
    const std::string database = (folder / "globs2").string();
    if (::access(database.c_str(), R_OK) == 0)
      return {role, State::works, "the desktop's database " + safeText(database), ""};
  }
  return {role, State::fallsBack, "no database of file types; a small one that is built in is used",
          "install the package shared-mime-info"};
}

Finding hardwareModel() {
  const std::string role = "Hardware model";
  std::array<char, 64> name{};
  std::size_t length = name.size();
  if (platform().systemControl.sysctl(kHardwareModelName, name.data(), &length) == 0)
    return {role, State::works, safeText(name.data()), ""};
  return {role, State::fallsBack, "the machine does not tell its model; it is left out of the summary",
          "write HARDWARE_MODEL= into /etc/machine-info"};
}

Finding preferences() {
  return {"Preferences", State::works,
          thisReleaseHasReported() ? "this release has reported" : "this release has not reported yet", ""};
}

Finding installation() {
  return {"Installation", State::works,
          platform().installation.isInternalInstall()
              ? "internal: the figures of Desktop and Documents are reported, exactly"
              : "not internal: nothing of Desktop and Documents is reported",
          ""};
}

// A folder that has yet to be made must be possible to make: the nearest one above it counts.
Finding indexFolder(const ToolWorld& world) {
  std::string folder = world.stores.path();
  while (folder.size() > 1 && ::access(folder.c_str(), F_OK) != 0)
    folder.resize(std::max<std::size_t>(folder.rfind('/'), 1));
  const std::string role = "Folder of the indexes";
  if (::access(folder.c_str(), W_OK | X_OK) == 0)
    return {role, State::works, safeText(world.stores.path()), ""};
  return {role, State::broken, safeText(folder) + ": " + reasonOf(errno) + "; no index can be made",
          "make the folder writable for you"};
}

Finding backupSettings(const std::optional<std::vector<std::string>>& volumes, const ToolWorld& world) {
  const std::string role = "Backup settings";
  const std::string remedy = "name the volumes as IncludedVolumes in chronel/backup.conf, or auto";
  if (!volumes)
    return {role, State::broken, "there are none that can be used, so no volume is measured", remedy};
  if (volumes->empty()) return {role, State::broken, "they include no volume, so none is measured", remedy};
  return {role, State::works, countText(world.digits, volumes->size(), "included volume"), ""};
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

DoctorPlaces DoctorPlaces::ofThisMachine() {
  DoctorPlaces places;
  places.pressureFiles = MemoryPressurePlaces::ofProcess(processEnvironment()).pressureFiles;
  return places;
}

std::vector<Finding> examine(const ToolWorld& world, const DoctorPlaces& places) {
  std::vector<Finding> findings{diagnosticLog(world, places),
                                reportedMessagesLog(world),
                                systemLog(places),
                                serviceManager(world),
                                memoryPressure(places),
                                ownMemory(world),
                                contentTypes(world),
                                hardwareModel(),
                                preferences(),
                                installation(),
                                homeFolder(),
                                startupVolumeCapacity(),
                                startupVolumeCounts(),
                                indexFolder(world)};
  const auto volumes = chosenVolumes(world, {});
  findings.push_back(backupSettings(volumes, world));
  const auto notReady = volumesNotReady(world);
  for (const std::string& volume : volumes.value_or(std::vector<std::string>()))
    findings.push_back(volumeFinding(world, volume, notReady));
  return findings;
}

}  // namespace norvex
