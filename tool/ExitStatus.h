// How the companion command ends, for scripts that run it.
#pragma once

namespace norvex {

enum class ExitStatus : int {
  success = 0,
  failed = 1,  // something could not be done; the lines on standard error say what
  usage = 2,   // the command line, or the predicate on it, makes no sense; nothing was done
};

// A command that has done several things has failed when one of them has.
inline void worsen(ExitStatus& status, ExitStatus other) {
  if (static_cast<int>(other) > static_cast<int>(status)) status = other;
}

}  // namespace norvex
