// What the tests share that run inside a user session of their own (tests/system/with-user-session): its
// manager, its journal, and the session's processes.
#pragma once

#include <sys/types.h>

#include <string>

#include "platform/linux/UserManager.h"
#include "tests/support/Eventually.h"

namespace norvex {

// The session's manager; the test program ends when it cannot be reached.
UserManager sessionManager();

// Runs a shell command. True when its exit status is 0.
bool shell(const std::string& command);

// What a shell command prints on its standard output.
std::string outputOf(const std::string& command);

// Ends the manager as a log-out does, and waits for the one of the next log-in.
void logOutAndIn();

// Holds a process of the session (its command line starts with `command`) for as long as the object lives.
class HeldProcess {
 public:
  explicit HeldProcess(const std::string& command);
  ~HeldProcess();
  HeldProcess(const HeldProcess&) = delete;
  HeldProcess& operator=(const HeldProcess&) = delete;

 private:
  pid_t process_ = 0;
};

inline constexpr const char* kManagerCommand = "/lib/systemd/systemd --user";
inline constexpr const char* kBusCommand = "/usr/bin/dbus-daemon --session";

// Folders of the session's home.
std::string unitsOfPackages();  // where a user's own packages put unit files
std::string unitsOfUser();      // where the user puts his

// A job of this name, switched off: com.brixo.NAME, with one timer. Its files are in `folder`, and the
// manager has read them. `command` is what the service runs.
std::string installJob(const std::string& name, const std::string& folder,
                       const std::string& command = "/bin/true");

inline std::string timerOf(const std::string& label) {
  return label + ".run4.timer";
}

}  // namespace norvex
