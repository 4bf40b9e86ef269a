#include <gtest/gtest.h>

#include <cerrno>

#include "platform/linux/AbsentJobRegistry.h"
#include "platform/linux/SilentMemoryPressureSource.h"

namespace norvex {
namespace {

TEST(AbsentJobRegistry, SaysThatItSwitchesNothingOff) {
  const Result<void> outcome = AbsentJobRegistry().disableJob(JobDomain::user, "com.brixo.NorvexAgent");
  ASSERT_FALSE(outcome);
  EXPECT_EQ(outcome.error().code, ENOSYS);
  EXPECT_EQ(outcome.error().description, "Function not implemented");
}

TEST(SilentMemoryPressureSource, CanBeSubscribedToAndStaysSilent) {
  int calls = 0;
  {
    const auto events = SilentMemoryPressureSource().create({.warning = true, .critical = true});
    events->setHandler([&calls] { ++calls; });
    events->resume();
  }
  EXPECT_EQ(calls, 0);
}

}  // namespace
}  // namespace norvex
