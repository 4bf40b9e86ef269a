// Diagnostic messages as lines of JSON in a file of the user's own: what is left of the log where no journal
// listens.
#pragma once

#include <chrono>
#include <functional>
#include <string>
#include <string_view>

#include "platform/DiagnosticLog.h"

namespace norvex {

class FileDiagnosticLog final : public DiagnosticLog {
 public:
  using WallClock = std::function<std::chrono::system_clock::time_point()>;

  // Where the file of a user with this state folder is.
  static std::string pathBelow(const std::string& stateFolder);

  // The file is pathBelow(`stateFolder`). It and its folders are made when needed, for
  // the user alone (0600, 0700).
  explicit FileDiagnosticLog(const std::string& stateFolder, WallClock now = std::chrono::system_clock::now);

  // Appends one line with the time in UTC and returns when it is on the disk. All of the line or nothing: a
  // line for which the disk has no room is taken back. A line that a crash has left unfinished is ended, so
  // that this one stands alone. What cannot be written is lost.
  //
  // The file is not written when it is a link: nobody manages a log as a link, and one that somebody else
  // could place (with a state folder in a place that is not the user's alone) would have the report appended
  // to a file that is none of its business.
  void logWithKeys(std::string_view domain, int level, std::span<const DiagnosticPair> pairs) override;

 private:
  void append(std::string line);

  std::string folder_;
  std::string path_;
  WallClock now_;
};

}  // namespace norvex
