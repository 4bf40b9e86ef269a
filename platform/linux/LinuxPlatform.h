// All roles as Linux plays them, in one object: what a program makes first and keeps to its end.
//
// Made on the main thread before any other is started; what it hands out may then be used as each role says.
#pragma once

#include "platform/MetadataIndex.h"
#include "platform/Platform.h"
#include "platform/linux/ConfBackupSettings.h"
#include "platform/linux/Environment.h"
#include "platform/linux/FileDiagnosticLog.h"
#include "platform/linux/JournalDiagnosticLog.h"
#include "platform/linux/JsonPreferenceStore.h"
#include "platform/linux/KernelMemoryPressureSource.h"
#include "platform/linux/LinuxActivityScheduler.h"
#include "platform/linux/LinuxDirectoryEnumeration.h"
#include "platform/linux/LinuxDirectoryListing.h"
#include "platform/linux/LinuxFileExistence.h"
#include "platform/linux/LinuxProcessControl.h"
#include "platform/linux/LinuxResourceValues.h"
#include "platform/linux/LinuxSystemControl.h"
#include "platform/linux/LinuxUserFolders.h"
#include "platform/linux/LocaleByteCountFormatter.h"
#include "platform/linux/MarkerFileInstallation.h"
#include "platform/linux/Mpeg4MediaReader.h"
#include "platform/linux/ProcStatusMemoryInfo.h"
#include "platform/linux/StatvfsVolumeCatalog.h"
#include "platform/linux/SteadyClock.h"
#include "platform/linux/ThreadEventLoops.h"
#include "platform/linux/UserManagerJobRegistry.h"
#include "platform/linux/XdgFolders.h"

namespace norvex {

class LinuxPlatform {
 public:
  // The command line as main got it, the environment of the process, and where lines for the system log go:
  // the log itself, or the terminal of whoever runs the program. `systemLog` outlives this object.
  LinuxPlatform(int argc, const char* const* argv, const Environment& environment, SystemLog& systemLog);
  LinuxPlatform(const LinuxPlatform&) = delete;
  LinuxPlatform& operator=(const LinuxPlatform&) = delete;

  // References to the roles of this object and to the two that are made elsewhere, of an index.
  // Both outlive whoever uses the set.
  Platform roles(MetadataIndex& metadataIndex, VolumeCatalog& volumeCatalog);

  // What an index is made of.
  EventLoops& eventLoops() { return eventLoops_; }
  VolumeCatalog& volumeCatalog() { return volumeCatalog_; }
  const XdgFolders& folders() const { return folders_; }

 private:
  XdgFolders folders_;
  SystemLog& systemLog_;
  LinuxProcessControl processControl_;
  LinuxUserFolders userFolders_;
  ConfBackupSettings backupSettings_;
  LocaleByteCountFormatter byteCountFormatter_;
  SteadyClock clock_;
  FileDiagnosticLog diagnosticFile_;
  JournalDiagnosticLog diagnosticLog_;
  LinuxDirectoryEnumeration directoryEnumeration_;
  LinuxDirectoryListing directoryListing_;
  ThreadEventLoops eventLoops_;
  LinuxFileExistence fileExistence_;
  MarkerFileInstallation installation_;
  UserManagerJobRegistry jobRegistry_;
  Mpeg4MediaReader mediaMetadataReader_;
  KernelMemoryPressureSource memoryPressureSource_;
  JsonPreferenceStore preferenceStore_;
  ProcStatusMemoryInfo processMemoryInfo_;
  LinuxResourceValues resourceValues_;
  LinuxSystemControl systemControl_;
  StatvfsVolumeCatalog volumeCatalog_;
  // Last, so that its queue thread ends before anything that its handler uses.
  LinuxActivityScheduler activityScheduler_;
};

}  // namespace norvex
