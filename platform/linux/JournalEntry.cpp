#include "platform/linux/JournalEntry.h"

#include <cstdint>

namespace norvex {

void JournalEntry::add(std::string_view name, std::string_view value) {
  bytes_ += name;
  if (value.find('\n') == std::string_view::npos) {
    bytes_ += '=';
  } else {
    // A line feed would end the field: its length is stated instead, in eight bytes, the lowest first.
    bytes_ += '\n';
    for (std::uint64_t length = value.size(), byte = 0; byte < sizeof(length); ++byte, length >>= 8) {
      bytes_ += static_cast<char>(length & 0xff);
    }
  }
  bytes_ += value;
  bytes_ += '\n';
}

}  // namespace norvex
