#include "tests/support/TestPlatform.h"

namespace norvex {

TestPlatform::TestPlatform(TestThreads threads)
    : metadataIndex(calls, loopsFor(threads)),
      roles_{activityScheduler,    backupSettings,      byteCountFormatter,   clock,         diagnosticLog,
             directoryEnumeration, directoryListing,    loopsFor(threads),    fileExistence, installation,
             jobRegistry,          mediaMetadataReader, memoryPressureSource, metadataIndex, preferenceStore,
             processControl,       processMemoryInfo,   resourceValues,       systemControl, systemLog,
             userFolders,          volumeCatalog},
      installed_(roles_) {}

EventLoops& TestPlatform::loopsFor(TestThreads threads) {
  if (threads == TestThreads::several) return threadedEventLoops;
  return eventLoops;
}

}  // namespace norvex
