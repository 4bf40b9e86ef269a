#include "platform/linux/BoxReader.h"

#include <algorithm>

namespace norvex {
namespace {

constexpr std::size_t kSizeLength = 4;
constexpr std::size_t kHeaderLength = 8;
// A header whose 32-bit size says that a 64-bit one follows the type.
constexpr std::size_t kWideHeaderLength = 16;
constexpr std::uint64_t kSizeFollows = 1;
constexpr std::uint64_t kToEndOfFile = 0;

}  // namespace

std::optional<Box> BoxReader::boxAt(std::uint64_t offset, const Box& parent) {
  if (offset >= parent.end || boxesRead_ == maxBoxes) return std::nullopt;
  const std::uint64_t left = parent.end - offset;
  if (left < kHeaderLength) return std::nullopt;
  const auto header =
      bytesAt(offset, static_cast<std::size_t>(std::min<std::uint64_t>(left, kWideHeaderLength)));
  if (!header) return std::nullopt;
  ++boxesRead_;

  std::uint64_t size = bigEndian32(header->data());
  std::size_t headerLength = kHeaderLength;
  if (size == kSizeFollows) {
    if (left < kWideHeaderLength) return std::nullopt;
    headerLength = kWideHeaderLength;
    size = std::uint64_t{bigEndian32(header->data() + kHeaderLength)} << 32U |
           bigEndian32(header->data() + kHeaderLength + kSizeLength);
  } else if (size == kToEndOfFile) {
    size = source_.size() - offset;
  }
  // Held against what is left, never added to the offset before: a huge size would wrap around.
  if (size < headerLength || size > left) return std::nullopt;
  return Box{bigEndian32(header->data() + kSizeLength), offset + headerLength, offset + size};
}

bool BoxReader::moveWindowTo(std::uint64_t offset) {
  if (offset >= source_.size()) return false;
  const auto wanted = static_cast<std::size_t>(std::min<std::uint64_t>(windowSize, source_.size() - offset));
  if (wanted > maxBytesRead - bytesRead_) return false;
  // What was asked for counts, not what came: a source that yields nothing is not asked for ever.
  bytesRead_ += wanted;
  windowBegin_ = offset;
  windowLength_ = source_.read(offset, std::span(window_).first(wanted));
  return true;
}

std::uint32_t bigEndian32(const char* bytes) {
  const auto byte = [bytes](std::size_t index) {
    return std::uint32_t{static_cast<unsigned char>(bytes[index])};
  };
  return byte(0) << 24U | byte(1) << 16U | byte(2) << 8U | byte(3);
}

}  // namespace norvex
