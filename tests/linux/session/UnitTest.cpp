// What a process is and may that the service manager has started: these tests run themselves again as a unit.
#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>

#include "Session.h"
#include "platform/linux/ControlGroup.h"
#include "platform/linux/KernelMemoryPressureSource.h"
#include "platform/linux/PressureTriggers.h"

namespace norvex {
namespace {

// True inside the unit. Outside runs the current test in one, expects it to pass there, and is false.
bool isInUnit(const std::string& unit) {
  if (ownServiceUnit(processEnvironment()) == unit) return true;
  const auto& test = *testing::UnitTest::GetInstance()->current_test_info();
  const std::string program = std::filesystem::read_symlink("/proc/self/exe");
  EXPECT_TRUE(shell("systemd-run --user --quiet --wait --pipe --service-type=exec --unit=" + unit + " " +
                    program + " --gtest_filter=" + test.test_suite_name() + "." + test.name()));
  return false;
}

TEST(ControlGroup, AServiceKnowsItsUnitAndItsChildrenAreNotTheService) {
  if (!isInUnit("com.brixo.Itself.service")) return;
  EXPECT_FALSE(shell("test \"$SYSTEMD_EXEC_PID\" = $$"));
  EXPECT_TRUE(ownControlGroup()->ends_with("/com.brixo.Itself.service"));
}

TEST(PressureTriggers, AServiceOfTheUserMaySetThemOnItsOwnControlGroup) {
  if (!isInUnit("com.brixo.Pressed.service")) return;
  const std::vector<std::string> files = MemoryPressurePlaces::ofProcess({}).pressureFiles;
  ASSERT_GE(files.size(), 2U);
  EXPECT_TRUE(files.front().ends_with("/com.brixo.Pressed.service/memory.pressure"));
  const Result<std::unique_ptr<PressureSensor>> sensor =
      PressureTriggers::onFile(files.front(), {.warning = true, .critical = true});
  if (!sensor && sensor.error().code == ENOENT) GTEST_SKIP() << "this kernel keeps no pressure of groups";
  EXPECT_TRUE(sensor) << sensor.error().description;
}

}  // namespace
}  // namespace norvex
