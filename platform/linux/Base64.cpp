#include "platform/linux/Base64.h"

#include <cstdint>

namespace norvex {
namespace {

constexpr std::string_view kAlphabet = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
constexpr std::size_t kGroup = 4;
constexpr unsigned kBitsOfDigit = 6;
constexpr unsigned kBitsOfByte = 8;

}  // namespace

std::optional<std::string> base64Decoded(std::string_view text) {
  if (text.size() % kGroup != 0) return std::nullopt;
  for (int padding = 0; padding < 2 && text.ends_with('='); ++padding) text.remove_suffix(1);
  std::string bytes;
  std::uint32_t bits = 0;
  unsigned count = 0;
  for (const char digit : text) {
    const std::size_t value = kAlphabet.find(digit);
    if (value == std::string_view::npos) return std::nullopt;
    bits = (bits << kBitsOfDigit) | static_cast<std::uint32_t>(value);
    count += kBitsOfDigit;
    if (count < kBitsOfByte) continue;
    count -= kBitsOfByte;
    bytes += static_cast<char>((bits >> count) & 0xff);
  }
  return bytes;
}

}  // namespace norvex
