// What the agent asks for its own process: its arguments, when it may be ended from outside, how it competes
// for the disk, and its end.
//
// Called by the entry on the main thread and by the run on the scheduler's queue.
#pragma once

#include <string>
#include <vector>

namespace norvex {

class ProcessControl {
 public:
  virtual ~ProcessControl() = default;

  // The command line as it was given, the program's own name first. Cannot fail.
  virtual const std::vector<std::string>& arguments() const = 0;

  // From now on the system may end the process without notice. Cannot fail.
  virtual void allowSuddenTermination() = 0;

  // From now on a request to end is held back until the process ends by itself. Cannot fail.
  virtual void disallowSuddenTermination() = 0;

  // From now on all disk I/O of the process, on threads that exist and that will exist, has the lowest
  // priority. Where the system refuses, the priority stays as it was: the figures do not depend on it.
  virtual void throttleDiskIO() = 0;

  // Ends the process at once with this exit status, wherever its other threads are.
  [[noreturn]] virtual void exit(int status) = 0;
};

}  // namespace norvex
