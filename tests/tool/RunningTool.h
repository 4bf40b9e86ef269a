// The real program in a process of its own, with private folders, and what it writes.
#pragma once

#include <sys/types.h>

#include <string>
#include <vector>

namespace norvex {

class RunningTool {
 public:
  enum class ErrorsGoTo { pipe, terminal };

  // Starts the program. Its settings, cache and data folders are below `folder`, which is absolute.
  RunningTool(const std::string& folder, const std::vector<std::string>& arguments,
              ErrorsGoTo errorsGoTo = ErrorsGoTo::pipe);
  ~RunningTool();  // ends it if need be
  RunningTool(const RunningTool&) = delete;
  RunningTool& operator=(const RunningTool&) = delete;

  // Waits until standard error holds the text; false when it has ended without.
  bool waitForError(const std::string& text);

  void signal(int number) const;

  // Waits for the end: the exit status, or 128 and the number of the signal that ended it.
  int wait();

  const std::string& errors() const { return errors_; }  // all of it after wait()

 private:
  bool readErrors();

  pid_t process_ = -1;
  int errorFd_ = -1;
  std::string errors_;
};

}  // namespace norvex
