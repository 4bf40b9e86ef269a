#include "platform/linux/LinuxPlatform.h"

#include <string>
#include <vector>

#include "platform/linux/ControlGroup.h"

namespace norvex {
namespace {

constexpr const char* kSystemConfigFolder = "/etc";
constexpr const char* kOwnFolder = "/norvex";

}  // namespace

LinuxPlatform::LinuxPlatform(int argc, const char* const* argv, const Environment& environment,
                             SystemLog& systemLog)
    : folders_(XdgFolders::fromEnvironment(environment)),
      systemLog_(systemLog),
      processControl_(std::vector<std::string>(argv, argv + argc)),
      userFolders_(folders_),
      backupSettings_({folders_.config, kSystemConfigFolder}, systemLog_),
      diagnosticFile_(folders_.state),
      diagnosticLog_(ownServiceUnit(environment), diagnosticFile_),
      jobRegistry_(environment),
      memoryPressureSource_(MemoryPressurePlaces::ofProcess(environment), clock_),
      preferenceStore_(folders_.config + kOwnFolder),
      activityScheduler_(environment) {}

Platform LinuxPlatform::roles(MetadataIndex& metadataIndex, VolumeCatalog& volumeCatalog) {
  return {.activityScheduler = activityScheduler_,
          .backupSettings = backupSettings_,
          .byteCountFormatter = byteCountFormatter_,
          .clock = clock_,
          .diagnosticLog = diagnosticLog_,
          .directoryEnumeration = directoryEnumeration_,
          .directoryListing = directoryListing_,
          .eventLoops = eventLoops_,
          .fileExistence = fileExistence_,
          .installation = installation_,
          .jobRegistry = jobRegistry_,
          .mediaMetadataReader = mediaMetadataReader_,
          .memoryPressureSource = memoryPressureSource_,
          .metadataIndex = metadataIndex,
          .preferenceStore = preferenceStore_,
          .processControl = processControl_,
          .processMemoryInfo = processMemoryInfo_,
          .resourceValues = resourceValues_,
          .systemControl = systemControl_,
          .systemLog = systemLog_,
          .userFolders = userFolders_,
          .volumeCatalog = volumeCatalog};
}

}  // namespace norvex
