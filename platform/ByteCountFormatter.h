// Byte counts as text for people.
//
// Called on any thread.
#pragma once

#include <cstdint>
#include <string>

namespace norvex {

class ByteCountFormatter {
 public:
  virtual ~ByteCountFormatter() = default;

  // The count in the file-size style: decimal units, the largest in which it is at least 1, no fraction for
  // bytes and KB, one digit for MB, two from GB on, trailing zeros of the fraction dropped; "1 byte", "Zero
  // KB". Grouping and decimal separator are those of the user's locale. UTF-8. Cannot fail.
  virtual std::string string(std::uint64_t bytes) const = 0;
};

}  // namespace norvex
