#include <gtest/gtest.h>

#include "platform/linux/SilentMemoryPressureSource.h"

namespace norvex {
namespace {

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
