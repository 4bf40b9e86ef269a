// Bytes that can be read at any offset: an open file, or a text in a test.
//
// Read by BoxReader, on the thread that made it.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

namespace norvex {

class ByteSource {
 public:
  virtual ~ByteSource() = default;

  // Bytes that there are. Stays the same for the life of the source, even when a file behind it changes.
  virtual std::uint64_t size() const = 0;

  // Fills `buffer` with what begins `offset` bytes from the start. The number of bytes that it got: fewer
  // than the buffer takes where the bytes end, 0 on failure. The rest of the buffer may be overwritten.
  virtual std::size_t read(std::uint64_t offset, std::span<char> buffer) = 0;
};

}  // namespace norvex
