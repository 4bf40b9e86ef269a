// What the kernel says of a process in its status file.
#pragma once

#include <sys/types.h>

#include <string>
#include <string_view>

namespace norvex {

// The value of the line "NAME:\tVALUE"; empty when the process has gone.
std::string statusOf(pid_t process, std::string_view name);

// Whether the signal is in one of the sets: "SigIgn", "SigBlk", "ShdPnd".
bool hasSignal(pid_t process, std::string_view set, int signal);

// Whether it has ended, reaped or not. It stays to be waited for.
bool hasEnded(pid_t child);

}  // namespace norvex
