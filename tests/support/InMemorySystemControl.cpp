#include "tests/support/InMemorySystemControl.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <iterator>

namespace norvex {

int InMemorySystemControl::sysctl(std::span<const int> name, void* buffer, std::size_t* length) {
  std::string call = "sysctl";
  for (const int part : name) call += " " + std::to_string(part);
  calls_.add(call);

  lastLength = *length;
  std::memset(buffer, 'X', *length);
  const bool known =
      std::equal(name.begin(), name.end(), std::begin(kHardwareModelName), std::end(kHardwareModelName));
  const std::size_t needed = modelName.size() + 1;
  errno = failure != 0 ? failure : !known ? ENOENT : needed > *length ? ENOMEM : 0;
  if (errno != 0) return -1;
  std::memcpy(buffer, modelName.c_str(), needed);
  *length = needed;
  return 0;
}

}  // namespace norvex
