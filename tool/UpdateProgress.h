// The line that shows how far an update has come: one line of a terminal that is written over and over.
//
// Made for one volume's update. show() is called by the crawl's thread while the maker waits.
#pragma once

#include <string>

#include "index/Crawl.h"
#include "platform/ByteCountFormatter.h"
#include "platform/Clock.h"
#include "tool/Console.h"

namespace norvex {

class UpdateProgress {
 public:
  // How often the line changes: often enough to see that something is done, too seldom to slow it down.
  static constexpr std::chrono::milliseconds kInterval{100};

  // All outlive this object. Writes nothing unless `console` is a terminal.
  UpdateProgress(Console& console, const Clock& clock, const ByteCountFormatter& byteCounts,
                 const std::string& volume);

  // Erases the line.
  ~UpdateProgress();
  UpdateProgress(const UpdateProgress&) = delete;
  UpdateProgress& operator=(const UpdateProgress&) = delete;

  // Writes the line anew when the last one is old enough.
  void show(const CrawlFigures& figures);

 private:
  void write(const CrawlFigures& figures, Clock::Moment now);

  Console& console_;
  const Clock& clock_;
  const ByteCountFormatter& byteCounts_;
  const std::string& volume_;
  const Clock::Moment started_;
  Clock::Moment lastShown_;
};

// Things a second, whole; 0 while no time has passed.
std::uint64_t perSecond(std::uint64_t count, std::chrono::duration<double> elapsed);

}  // namespace norvex
