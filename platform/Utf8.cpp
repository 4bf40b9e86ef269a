#include "platform/Utf8.h"

#include <cstddef>
#include <cstdint>

namespace norvex {

bool isValidUtf8(std::string_view text) {
  for (std::size_t i = 0; i < text.size();) {
    const auto lead = static_cast<unsigned char>(text[i]);
    std::size_t following = 0;
    std::uint32_t character = 0;
    std::uint32_t smallest = 0;
    if (lead < 0x80) {
      ++i;
      continue;
    }
    if ((lead & 0xE0U) == 0xC0) {
      following = 1, character = lead & 0x1FU, smallest = 0x80;
    } else if ((lead & 0xF0U) == 0xE0) {
      following = 2, character = lead & 0x0FU, smallest = 0x800;
    } else if ((lead & 0xF8U) == 0xF0) {
      following = 3, character = lead & 0x07U, smallest = 0x10000;
    } else {
      return false;
    }
    if (text.size() - i <= following) return false;
    for (std::size_t k = 1; k <= following; ++k) {
      const auto next = static_cast<unsigned char>(text[i + k]);
      if ((next & 0xC0U) != 0x80) return false;
      character = character << 6U | (next & 0x3FU);
    }
    const bool isSurrogate = character >= 0xD800 && character <= 0xDFFF;
    if (character < smallest || character > 0x10FFFF || isSurrogate) return false;
    i += following + 1;
  }
  return true;
}

}  // namespace norvex
