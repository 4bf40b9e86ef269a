#include <gtest/gtest.h>

#include "tests/support/TestPlatform.h"

namespace norvex {
namespace {

Platform withSystemLog(const Platform& roles, SystemLog& systemLog) {
  return {roles.activityScheduler,    roles.backupSettings,
          roles.byteCountFormatter,   roles.clock,
          roles.diagnosticLog,        roles.directoryEnumeration,
          roles.directoryListing,     roles.eventLoops,
          roles.fileExistence,        roles.installation,
          roles.jobRegistry,          roles.mediaMetadataReader,
          roles.memoryPressureSource, roles.metadataIndex,
          roles.preferenceStore,      roles.processControl,
          roles.processMemoryInfo,    roles.resourceValues,
          roles.systemControl,        systemLog,
          roles.userFolders,          roles.volumeCatalog};
}

TEST(ScopedPlatform, InstallsItsRolesAndPutsTheOldOnesBack) {
  TestPlatform world;
  InMemorySystemLog other(world.calls);
  const Platform roles = withSystemLog(platform(), other);
  {
    const ScopedPlatform installed(roles);
    EXPECT_EQ(&platform(), &roles);
    platform().systemLog.syslog(LogLevel::notice, "inner");
  }
  platform().systemLog.syslog(LogLevel::notice, "outer");
  EXPECT_EQ(other.lines, std::vector<std::string>{"5 inner"});
  EXPECT_EQ(world.systemLog.lines, std::vector<std::string>{"5 outer"});
}

TEST(ScopedPlatform, Nests) {
  TestPlatform world;
  const Platform* outermost = &platform();
  const Platform first = withSystemLog(platform(), world.systemLog);
  const Platform second = withSystemLog(platform(), world.systemLog);
  const ScopedPlatform outer(first);
  {
    const ScopedPlatform inner(second);
    EXPECT_EQ(&platform(), &second);
  }
  EXPECT_EQ(&platform(), &first);
  EXPECT_NE(&platform(), outermost);
}

}  // namespace
}  // namespace norvex
