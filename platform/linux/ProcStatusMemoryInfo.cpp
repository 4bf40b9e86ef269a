#include "platform/linux/ProcStatusMemoryInfo.h"

#include <cerrno>
#include <charconv>
#include <limits>
#include <string_view>

#include "platform/linux/Files.h"

namespace norvex {
namespace {

constexpr std::size_t kLargestStatus = std::size_t{64} * 1024;
constexpr std::uint64_t kBytesPerKilobyte = 1024;  // the kernel's "kB"

std::string_view withoutLeadingBlanks(std::string_view text) {
  const std::size_t start = text.find_first_not_of(" \t");
  return start == std::string_view::npos ? std::string_view() : text.substr(start);
}

// What follows `field` on the line that starts with it; empty when no line does.
std::string_view lineOf(std::string_view status, std::string_view field) {
  while (!status.empty()) {
    const std::size_t end = status.find('\n');
    const std::string_view line = status.substr(0, end);
    if (line.starts_with(field)) return line.substr(field.size());
    status = end == std::string_view::npos ? std::string_view() : status.substr(end + 1);
  }
  return {};
}

Result<std::uint64_t> bytesOf(std::string_view status, std::string_view field) {
  const std::string_view text = withoutLeadingBlanks(lineOf(status, field));
  std::uint64_t kilobytes = 0;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), kilobytes);
  if (error == std::errc::result_out_of_range) return systemError(EOVERFLOW);
  if (error != std::errc()) return systemError(ENODATA);
  const std::string_view unit = text.substr(static_cast<std::size_t>(end - text.data()));
  if (unit != " kB") return systemError(ENODATA);
  if (kilobytes > std::numeric_limits<std::uint64_t>::max() / kBytesPerKilobyte) {
    return systemError(EOVERFLOW);
  }
  return kilobytes * kBytesPerKilobyte;
}

}  // namespace

Result<MemoryUse> ProcStatusMemoryInfo::ownProcess() {
  const Result<std::string> status = readWholeFile(statusPath_, kLargestStatus);
  if (!status) return status.error();
  const Result<std::uint64_t> internal = bytesOf(status.value(), "RssAnon:");
  if (!internal) return internal.error();
  const Result<std::uint64_t> compressed = bytesOf(status.value(), "VmSwap:");
  if (!compressed) return compressed.error();
  return MemoryUse{internal.value(), compressed.value()};
}

}  // namespace norvex
