// A whole platform in memory, installed for the life of the object: what a test of the core runs on.
//
//   TestPlatform world;
//   world.files.put("/Users/user", folder("Desktop", {file("a", 5)}));
//   ...
//   EXPECT_THAT(world.systemLog.lines, IsEmpty());
#pragma once

#include "platform/Platform.h"
#include "tests/support/CallJournal.h"
#include "tests/support/InMemoryActivity.h"
#include "tests/support/InMemoryActivityScheduler.h"
#include "tests/support/InMemoryBackupSettings.h"
#include "tests/support/InMemoryByteCountFormatter.h"
#include "tests/support/InMemoryClock.h"
#include "tests/support/InMemoryDiagnosticLog.h"
#include "tests/support/InMemoryDirectoryEnumeration.h"
#include "tests/support/InMemoryDirectoryListing.h"
#include "tests/support/InMemoryEventLoops.h"
#include "tests/support/InMemoryFileExistence.h"
#include "tests/support/InMemoryFileTree.h"
#include "tests/support/InMemoryInstallation.h"
#include "tests/support/InMemoryJobRegistry.h"
#include "tests/support/InMemoryMediaMetadataReader.h"
#include "tests/support/InMemoryMemoryPressureSource.h"
#include "tests/support/InMemoryMetadataIndex.h"
#include "tests/support/InMemoryPreferenceStore.h"
#include "tests/support/InMemoryProcessControl.h"
#include "tests/support/InMemoryProcessMemoryInfo.h"
#include "tests/support/InMemoryResourceValues.h"
#include "tests/support/InMemorySystemControl.h"
#include "tests/support/InMemorySystemLog.h"
#include "tests/support/InMemoryUserFolders.h"
#include "tests/support/InMemoryVolumeCatalog.h"
#include "tests/support/ThreadedEventLoops.h"

namespace norvex {

// Which loops a platform has: one in simulated time, or one a thread.
enum class TestThreads { one, several };

class TestPlatform {
 public:
  explicit TestPlatform(TestThreads threads = TestThreads::one);

  CallJournal calls;
  InMemoryClock clock;
  InMemoryFileTree files;

  InMemoryActivityScheduler activityScheduler{calls};
  InMemoryBackupSettings backupSettings{calls};
  InMemoryByteCountFormatter byteCountFormatter;
  InMemoryDiagnosticLog diagnosticLog{calls};
  InMemoryDirectoryEnumeration directoryEnumeration{calls, files};
  InMemoryDirectoryListing directoryListing{calls, files};
  InMemoryEventLoops eventLoops{calls, clock};
  ThreadedEventLoops threadedEventLoops;
  InMemoryFileExistence fileExistence{calls, files};
  InMemoryInstallation installation{calls};
  InMemoryJobRegistry jobRegistry{calls};
  InMemoryMediaMetadataReader mediaMetadataReader{calls};
  InMemoryMemoryPressureSource memoryPressureSource{calls};
  InMemoryMetadataIndex metadataIndex;
  InMemoryPreferenceStore preferenceStore{calls};
  InMemoryProcessControl processControl{calls};
  InMemoryProcessMemoryInfo processMemoryInfo{calls};
  InMemoryResourceValues resourceValues{calls, files};
  InMemorySystemControl systemControl{calls};
  InMemorySystemLog systemLog{calls};
  InMemoryUserFolders userFolders;
  InMemoryVolumeCatalog volumeCatalog{calls};

 private:
  EventLoops& loopsFor(TestThreads threads);

  Platform roles_;
  ScopedPlatform installed_;
};

}  // namespace norvex
