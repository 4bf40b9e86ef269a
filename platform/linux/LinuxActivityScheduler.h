// The activity of the agent's job: the service manager starts the process when the moment is good, a signal
// asks for a run by hand.
//
// The conditions of a good moment stand in the job's units. What is left to this class is to tell a start by
// the service manager, which is the request for a run, from a start by hand, which waits for SIGUSR1.
#pragma once

#include <string>
#include <thread>

#include "platform/ActivityScheduler.h"
#include "platform/FileDescriptor.h"
#include "platform/linux/Environment.h"

namespace norvex {

class LinuxActivityScheduler final : public ActivityScheduler {
 public:
  // `environment` is that of the process.
  explicit LinuxActivityScheduler(const Environment& environment);

  // Ends the queue thread once the handler that it may be in has returned.
  ~LinuxActivityScheduler() override;

  // Holds SIGUSR1 back from the calling thread and the threads that it starts, so that one that comes early
  // waits for the scheduler instead of ending the process. To be called first thing in main.
  static void blockRunSignal();

  // On a queue thread of its own calls the handler in the state checkIn, then in the state run: at once when
  // the service manager started this very process (SYSTEMD_EXEC_PID is its id), and for every SIGUSR1, one
  // that came before included. Signals that come while a call is under way count as one. The process has one
  // activity; a further registration is never called.
  void registerActivity(const std::string& identifier, ActivityCriteria criteria, Handler handler) override;

 private:
  void serve(const Handler& handler) const;
  bool waitForRunSignal() const;

  bool startedForRun_ = false;
  FileDescriptor signals_;  // readable when a SIGUSR1 is pending
  FileDescriptor ending_;   // readable when the queue thread is to end
  std::thread queue_;
};

}  // namespace norvex
