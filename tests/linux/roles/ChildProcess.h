// Child processes for what a test cannot do to its own: end it, take its rights away, change its mounts.
#pragma once

#include <functional>
#include <string>

namespace norvex {

struct ChildEnd {
  int status = 0;      // as of waitpid(2)
  std::string report;  // what the body returned
};

// Forks, runs `body` in the child and returns what it reports. The child then ends with status 0.
ChildEnd inChild(const std::function<std::string()>& body);

// A report that begins so says why the kernel does not let the test be made.
inline constexpr const char* kImpossible = "impossible here: ";

// For a child: gives it mounts of its own. Empty on success, else a report that begins with kImpossible.
std::string enterPrivateMounts();

// For a child: mounts a memory file system of `size` (as its option says it) on `folder`. As above.
std::string mountSmallDisk(const std::string& folder, const std::string& size);

// For a child that runs as root: makes it an unprivileged user's. True when it is one's.
bool becomeUnprivileged();

// The user and group that becomeUnprivileged() changes to.
inline constexpr unsigned kUnprivilegedId = 65534;

}  // namespace norvex

// For a test: skips it, with the reason, when `end` reports that it cannot be made here.
#define NORVEX_SKIP_IF_IMPOSSIBLE(end) \
  if ((end).report.starts_with(norvex::kImpossible)) GTEST_SKIP() << (end).report
