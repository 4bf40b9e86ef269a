// One of the streams that the companion command writes to, and what is at its other end: a terminal of some
// width, or something that keeps every byte.
//
// Made by main; used by the commands, on the main thread. The progress of an update is written on the thread
// that crawls, while the main thread waits.
#pragma once

#include <cstddef>
#include <ostream>
#include <string>
#include <string_view>

#include "platform/linux/Environment.h"

namespace norvex {

struct ConsoleStyle {
  static constexpr std::size_t kUsualWidth = 80;

  bool isTerminal = false;
  bool hasColour = false;
  bool hasUtf8 = false;             // can show letters of any script
  std::size_t width = kUsualWidth;  // columns

  // Of an open descriptor. Colour is for terminals that have it, and where NO_COLOR is not set to anything.
  static ConsoleStyle of(int descriptor, const Environment& environment);
};

class Console {
 public:
  enum class Ink { bold, dim, bar, warning };

  // `stream` outlives this object.
  Console(std::ostream& stream, const ConsoleStyle& style) : stream_(stream), style_(style) {}

  std::ostream& stream() { return stream_; }
  const ConsoleStyle& style() const { return style_; }

  // `text` in the ink where there is colour, else as it is.
  std::string inked(Ink ink, std::string_view text) const;

  // One line for people, after the name of the program: what happened, where, and what to do.
  void tell(std::string_view message);

 private:
  std::ostream& stream_;
  ConsoleStyle style_;
};

}  // namespace norvex
