// The kernel's table of system facts, asked by a numeric name.
//
// Called on the thread of the run.
#pragma once

#include <cstddef>
#include <span>

namespace norvex {

class SystemControl {
 public:
  virtual ~SystemControl() = default;

  // Writes the fact `name` with its terminating zero byte into `buffer` and its length, that byte included,
  // into `length`, which holds the buffer's size on entry. 0 on success; otherwise -1 with errno set (ENOMEM:
  // it does not fit, ENOENT: there is none) and an undefined buffer.
  virtual int sysctl(std::span<const int> name, void* buffer, std::size_t* length) = 0;
};

// {hardware, model}: the name by which the machine's maker calls its model.
inline constexpr int kHardwareModelName[] = {6, 2};

}  // namespace norvex
