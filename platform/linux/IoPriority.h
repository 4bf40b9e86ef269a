// I/O priorities as ioprio_set(2) and ioprio_get(2) have them. The C library has neither calls nor constants,
// and the kernel's own header is not C++ in all of its versions.
//
// Pure functions; any thread.
#pragma once

namespace norvex {

inline constexpr int kIoPriorityOfProcess = 1;  // what the number names: a process, that is one thread
inline constexpr int kIoClassIdle = 3;          // served when nobody else wants the disk

inline constexpr int kIoClassShift = 13;

// A class without a level, as the call takes it.
constexpr int ioPriority(int ioClass) {
  return ioClass << kIoClassShift;
}

// The class of what the call returns.
constexpr int ioClassOf(int priority) {
  return priority >> kIoClassShift;
}

}  // namespace norvex
