// One line of a terminal that is written over and over while something takes long, and is gone at its end.
//
// Made by whoever starts the work; written by the thread that does it while the maker waits.
#pragma once

#include <chrono>
#include <optional>
#include <string>
#include <string_view>

#include "platform/Clock.h"
#include "tool/Console.h"

namespace norvex {

class ProgressLine {
 public:
  // How often the line changes: often enough to see that something is done, too seldom to slow it down.
  static constexpr std::chrono::milliseconds kInterval{100};

  // Both outlive this object. Writes nothing, ever, unless `console` is a terminal.
  ProgressLine(Console& console, const Clock& clock);
  ~ProgressLine();  // erases the line
  ProgressLine(const ProgressLine&) = delete;
  ProgressLine& operator=(const ProgressLine&) = delete;

  // Whether there is a terminal, and no line on it that is newer than the interval.
  bool isDue() const;

  // Writes the line, cut to the terminal's width. The text is safe to be shown.
  void show(std::string_view text);

  // Makes room for a line of another kind.
  void erase();

  std::chrono::duration<double> elapsed() const { return clock_.now() - started_; }

 private:
  Console& console_;
  const Clock& clock_;
  const Clock::Moment started_;
  std::optional<Clock::Moment> shown_;
  bool isOnScreen_ = false;
};

// Things a second, whole; 0 while no time has passed.
std::uint64_t perSecond(std::uint64_t count, std::chrono::duration<double> elapsed);

// ", about 0:12 left" when `done`, the part of the work that has been done, 0 to 1, lets that be told; else
// nothing.
std::string remainingText(double done, std::chrono::duration<double> elapsed);

}  // namespace norvex
