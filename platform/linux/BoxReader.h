// The headers of the boxes that an MPEG-4 file is made of, read through one small window.
//
// Made by MediaItemList for one pass over one file, on one thread. Whatever the headers claim, a reader holds
// one window of memory, and it stops for good once it has read its share of bytes or boxes.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string_view>

#include "platform/linux/ByteSource.h"

namespace norvex {

// A box that lies within its parent. Offsets count bytes from the start of the file; begin <= end.
struct Box {
  // Four characters, the first one in the most significant byte.
  std::uint32_t type = 0;
  // What follows the header: from its first byte to the first byte behind it.
  std::uint64_t begin = 0;
  std::uint64_t end = 0;
};

constexpr std::uint32_t boxType(const char (&characters)[5]) {
  std::uint32_t type = 0;
  for (int i = 0; i < 4; ++i) type = type << 8U | static_cast<unsigned char>(characters[i]);
  return type;
}

class BoxReader {
 public:
  // Bytes that are asked of the source at once. Neighbouring headers of an item list mostly share a window.
  static constexpr std::size_t windowSize = 512;
  // Bytes and boxes after which nothing more is read. Files of real writers need about a tenth of that.
  static constexpr std::size_t maxBytesRead = 96 * windowSize;
  static constexpr std::size_t maxBoxes = 1024;

  // `source` outlives the reader.
  explicit BoxReader(ByteSource& source) : source_(source) {}

  // The whole file, as the parent of the outermost boxes.
  Box file() const { return Box{0, 0, source_.size()}; }

  // The box whose header stands at `offset` within `parent`. Nothing when there is no room for a header, when
  // the size is less than its own header or more than what the parent has left, when it cannot be read, and
  // beyond the reader's share. A size of 0 reaches to the end of the file, so only a parent that does so too
  // can hold such a box.
  std::optional<Box> boxAt(std::uint64_t offset, const Box& parent);

  // The `length` bytes at `offset`, at most windowSize of them, valid until the next call; or nothing when
  // not all of them can be read.
  std::optional<std::string_view> bytesAt(std::uint64_t offset, std::size_t length) {
    if (!isInWindow(offset, length) && !(moveWindowTo(offset) && isInWindow(offset, length)))
      return std::nullopt;
    return std::string_view(window_.data() + (offset - windowBegin_), length);
  }

 private:
  bool isInWindow(std::uint64_t offset, std::size_t length) const {
    return offset >= windowBegin_ && offset - windowBegin_ <= windowLength_ &&
           length <= windowLength_ - static_cast<std::size_t>(offset - windowBegin_);
  }
  bool moveWindowTo(std::uint64_t offset);

  ByteSource& source_;
  std::array<char, windowSize> window_{};
  std::uint64_t windowBegin_ = 0;
  std::size_t windowLength_ = 0;
  std::size_t bytesRead_ = 0;
  std::size_t boxesRead_ = 0;
};

// The unsigned number that the four bytes at `bytes` stand for, the most significant one first.
std::uint32_t bigEndian32(const char* bytes);

}  // namespace norvex
