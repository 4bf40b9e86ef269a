#include "platform/linux/ControlGroup.h"

#include <gtest/gtest.h>
#include <unistd.h>

namespace norvex {
namespace {

TEST(ControlGroup, IsThatOfTheUnifiedHierarchy) {
  struct Case {
    const char* text;
    std::optional<std::string> group;
  };
  const Case cases[] = {
      {"0::/\n", "/"},
      {"9:name=systemd:/a\n4:memory:/b\n0::/user.slice/a b:c.service\n", "/user.slice/a b:c.service"},
      {"0::/no/line/feed", "/no/line/feed"},
      {"9:name=systemd:/a\n", std::nullopt},
      {"10::/a\n", std::nullopt},
      {"0::relative\n", std::nullopt},
      {"", std::nullopt},
  };
  for (const Case& row : cases) EXPECT_EQ(controlGroupIn(row.text), row.group) << row.text;
}

TEST(ControlGroup, AProcessThatTheServiceManagerDidNotStartRunsAsNoService) {
  EXPECT_EQ(ownServiceUnit({}), "");
  EXPECT_EQ(ownServiceUnit({{"SYSTEMD_EXEC_PID", std::to_string(::getppid())}}), "");
}

}  // namespace
}  // namespace norvex
