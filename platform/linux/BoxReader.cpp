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

  std::uint64_t size = bigEndian(header->substr(0, kSizeLength));
  std::size_t headerLength = kHeaderLength;
  if (size == kSizeFollows) {
    if (left < kWideHeaderLength) return std::nullopt;
    headerLength = kWideHeaderLength;
    size = bigEndian(header->substr(kHeaderLength));
  } else if (size == kToEndOfFile) {
    size = source_.size() - offset;
  }
  // Held against what is left, never added to the offset before: a huge size would wrap around.
  if (size < headerLength || size > left) return std::nullopt;
  const auto type = static_cast<std::uint32_t>(bigEndian(header->substr(kSizeLength, kSizeLength)));
  return Box{type, offset + headerLength, offset + size};
}

std::optional<std::string_view> BoxReader::bytesAt(std::uint64_t offset, std::size_t length) {
  const auto isInWindow = [&] {
    return offset >= windowBegin_ && offset - windowBegin_ <= windowLength_ &&
           length <= windowLength_ - static_cast<std::size_t>(offset - windowBegin_);
  };
  if (!isInWindow() && !(moveWindowTo(offset) && isInWindow())) return std::nullopt;
  return std::string_view(window_.data(), windowLength_)
      .substr(static_cast<std::size_t>(offset - windowBegin_), length);
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

std::uint64_t bigEndian(std::string_view bytes) {
  std::uint64_t number = 0;
  for (const char byte : bytes) number = number << 8U | static_cast<unsigned char>(byte);
  return number;
}

}  // namespace norvex
