#include "tool/Console.h"

#include <langinfo.h>
#include <sys/ioctl.h>
#include <unistd.h>

#include <array>
#include <charconv>

namespace norvex {
namespace {

constexpr std::array<std::string_view, 4> kInks{"\x1b[1m", "\x1b[2m", "\x1b[36m", "\x1b[33m"};
constexpr std::string_view kPlainInk = "\x1b[0m";
constexpr std::size_t kNarrowest = 20, kWidest = 1000;

bool isSet(const Environment& environment, const std::string& name) {
  return !valueOf(environment, name).value_or("").empty();
}

std::size_t widthOf(int descriptor, const Environment& environment) {
  std::size_t width = 0;
  winsize size{};
  if (::ioctl(descriptor, TIOCGWINSZ, &size) == 0) width = size.ws_col;
  if (width == 0) {
    const std::string columns = valueOf(environment, "COLUMNS").value_or("");
    std::from_chars(columns.data(), columns.data() + columns.size(), width);
  }
  return width < kNarrowest || width > kWidest ? ConsoleStyle::kUsualWidth : width;
}

}  // namespace

ConsoleStyle ConsoleStyle::of(int descriptor, const Environment& environment) {
  ConsoleStyle style;
  style.hasUtf8 = std::string_view(::nl_langinfo(CODESET)) == "UTF-8";
  style.isTerminal = ::isatty(descriptor) == 1;
  if (!style.isTerminal) return style;
  style.hasColour =
      !isSet(environment, "NO_COLOR") && isSet(environment, "TERM") && valueOf(environment, "TERM") != "dumb";
  style.width = widthOf(descriptor, environment);
  return style;
}

std::string Console::inked(Ink ink, std::string_view text) const {
  if (!style_.hasColour) return std::string(text);
  return std::string(kInks[static_cast<std::size_t>(ink)]).append(text).append(kPlainInk);
}

void Console::tell(std::string_view message) {
  stream_ << "norvexctl: " << message << '\n' << std::flush;
}

}  // namespace norvex
