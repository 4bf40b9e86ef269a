// All roles that the core needs of the operating system, and the one place through which it reaches them.
#pragma once

#include "platform/ActivityScheduler.h"
#include "platform/BackupSettings.h"
#include "platform/ByteCountFormatter.h"
#include "platform/Clock.h"
#include "platform/DiagnosticLog.h"
#include "platform/DirectoryEnumerator.h"
#include "platform/DirectoryListing.h"
#include "platform/EventLoop.h"
#include "platform/FileExistence.h"
#include "platform/Installation.h"
#include "platform/JobRegistry.h"
#include "platform/MediaMetadataReader.h"
#include "platform/MemoryPressureSource.h"
#include "platform/MetadataIndex.h"
#include "platform/PreferenceStore.h"
#include "platform/ProcessControl.h"
#include "platform/ProcessMemoryInfo.h"
#include "platform/ResourceValues.h"
#include "platform/SystemControl.h"
#include "platform/SystemLog.h"
#include "platform/UserFolders.h"
#include "platform/VolumeCatalog.h"

namespace norvex {

// References to roles that somebody else owns and keeps alive for as long as the set is installed.
struct Platform {
  ActivityScheduler& activityScheduler;
  BackupSettings& backupSettings;
  ByteCountFormatter& byteCountFormatter;
  Clock& clock;
  DiagnosticLog& diagnosticLog;
  DirectoryEnumeration& directoryEnumeration;
  DirectoryListing& directoryListing;
  EventLoops& eventLoops;
  FileExistence& fileExistence;
  Installation& installation;
  JobRegistry& jobRegistry;
  MediaMetadataReader& mediaMetadataReader;
  MemoryPressureSource& memoryPressureSource;
  MetadataIndex& metadataIndex;
  PreferenceStore& preferenceStore;
  ProcessControl& processControl;
  ProcessMemoryInfo& processMemoryInfo;
  ResourceValues& resourceValues;
  SystemControl& systemControl;
  SystemLog& systemLog;
  UserFolders& userFolders;
  VolumeCatalog& volumeCatalog;
};

// The installed set. Only after one has been installed; from any thread.
const Platform& platform();

// Installs a set of roles for as long as the object lives and then puts back what was installed before. Made
// and destroyed while no other thread uses platform(); the set outlives it.
class ScopedPlatform {
 public:
  explicit ScopedPlatform(const Platform& roles);
  ~ScopedPlatform();
  ScopedPlatform(const ScopedPlatform&) = delete;
  ScopedPlatform& operator=(const ScopedPlatform&) = delete;

 private:
  const Platform* previous_;
};

}  // namespace norvex
