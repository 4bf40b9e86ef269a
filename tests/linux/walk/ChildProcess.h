// Runs a part of a test in a child process, for what would change the whole process: its user, its limits,
// its mounts.
#pragma once

#include <functional>

namespace norvex {

// Runs `body` in a child. Expectations that fail there are printed there and fail the test here.
void inChildProcess(const std::function<void()>& body);

// The same, as a user for whom permissions hold: root becomes "nobody", everybody else stays.
void asOrdinaryUser(const std::function<void()>& body);

// Gives the process its own view of what is mounted, in which it may mount. For a child process.
bool enterOwnMounts();

// Whether a child process can mount a file system of this type. Leaves this process as it is.
bool canMount(const char* type);

}  // namespace norvex
