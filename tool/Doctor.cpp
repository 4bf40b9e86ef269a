#include "tool/Doctor.h"

#include <filesystem>
#include <system_error>
#include <utility>

#include "platform/linux/Environment.h"
#include "platform/linux/KernelMemoryPressureSource.h"
#include "platform/linux/XdgFolders.h"
#include "tool/MeasuringFindings.h"
#include "tool/ServiceFindings.h"
#include "tool/SettingFindings.h"

namespace norvex {
namespace {

using Look = Finding (*)(const Examined&);

// In the order in which people read them. Each role of the platform is in one of the rows.
constexpr Look kLooks[] = {
    // What the agent says, and where.
    diagnosticLog,
    reportedMessagesLog,
    systemLog,
    // What starts it and holds it.
    serviceManager,
    activityScheduler,
    memoryPressure,
    ownMemory,
    eventLoop,
    clockThatGoesOn,
    // What it measures with.
    homeFolder,
    folderWalk,
    fileAttributes,
    startupVolumeCapacity,
    startupVolumeCounts,
    mediaReader,
    metadataIndex,
    contentTypes,
    hardwareModel,
    byteCounts,
    // What it goes by.
    preferences,
    installation,
    indexFolder,
    backupSettings,
};

// The first of the variables that is set and not empty, as the C library reads them; else the plain locale.
std::string localeOfNumbers(const Environment& environment) {
  for (const char* name : {"LC_ALL", "LC_NUMERIC", "LANG"}) {
    std::string value = valueOf(environment, name).value_or("");
    if (!value.empty()) return value;
  }
  return "C";
}

}  // namespace

DoctorPlaces DoctorPlaces::ofThisMachine() {
  const Environment environment = processEnvironment();
  DoctorPlaces places;
  places.pressureFiles = MemoryPressurePlaces::ofProcess(environment).pressureFiles;
  places.preferenceFolder = XdgFolders::fromEnvironment(environment).config + "/norvex";
  std::error_code error;  // none that can be used: where it should be, for the finding to name
  const std::filesystem::path temporary = std::filesystem::temp_directory_path(error);
  places.temporaryFolder = error ? "/tmp" : temporary.string();
  places.numbersLocale = localeOfNumbers(environment);
  return places;
}

std::vector<Finding> examine(const ToolWorld& world, const DoctorPlaces& places) {
  const Examined examined{world, places};
  std::vector<Finding> findings;
  for (const Look look : kLooks) findings.push_back(look(examined));
  for (Finding& finding : includedVolumes(examined)) findings.push_back(std::move(finding));
  // Last, since all that comes after it may have to wait for a busy disk.
  findings.push_back(diskPriority(examined));
  return findings;
}

}  // namespace norvex
