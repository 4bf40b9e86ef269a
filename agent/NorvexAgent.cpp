// The program: makes the roles as this machine plays them, and hands over to the entry.
#include "agent/main.h"
#include "machine/MachinePlatform.h"
#include "platform/linux/LinuxActivityScheduler.h"
#include "platform/linux/SyslogSystemLog.h"

int main(int argc, char* argv[]) {
  // Before anything else: a request to run that comes this early must wait, not end the process.
  norvex::LinuxActivityScheduler::blockRunSignal();

  norvex::SyslogSystemLog systemLog;
  const norvex::MachinePlatform machine(argc, argv, norvex::processEnvironment(), systemLog);
  const norvex::ScopedPlatform installed(machine.roles());
  return norvex::main();
}
