#include "tests/linux/walk/ChildProcess.h"

#include <grp.h>
#include <gtest/gtest.h>
#include <sched.h>
#include <sys/mount.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>

namespace norvex {
namespace {

constexpr uid_t kNobody = 65534;

void becomeOrdinary() {
  if (::geteuid() != 0) return;
  ASSERT_EQ(::setgroups(0, nullptr), 0);
  ASSERT_EQ(::setgid(kNobody), 0);
  ASSERT_EQ(::setuid(kNobody), 0);
}

}  // namespace

void inChildProcess(const std::function<void()>& body) {
  std::fflush(nullptr);
  const pid_t child = ::fork();
  ASSERT_GE(child, 0);
  if (child == 0) {
    body();
    std::fflush(nullptr);
    // Not exit(): what the parent registered to be done at the end is the parent's.
    ::_exit(testing::Test::HasFailure() ? 1 : 0);
  }
  int status = 0;
  ASSERT_EQ(::waitpid(child, &status, 0), child);
  EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0) << "the child process failed: status " << status;
}

void asOrdinaryUser(const std::function<void()>& body) {
  inChildProcess([&] {
    becomeOrdinary();
    if (!testing::Test::HasFatalFailure()) body();
  });
}

bool enterOwnMounts() {
  const bool entered = ::unshare(CLONE_NEWNS) == 0 || ::unshare(CLONE_NEWUSER | CLONE_NEWNS) == 0;
  return entered && ::mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr) == 0;
}

bool canMount(const char* type) {
  const pid_t child = ::fork();
  if (child == 0) {
    _exit(enterOwnMounts() && ::mount("none", "/tmp", type, 0, nullptr) == 0 ? 0 : 1);
  }
  int status = 1;
  return child > 0 && ::waitpid(child, &status, 0) == child && status == 0;
}

}  // namespace norvex
