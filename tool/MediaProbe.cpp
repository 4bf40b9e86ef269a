#include "tool/MediaProbe.h"

#include <fcntl.h>
#include <stdlib.h>
#include <unistd.h>

#include <cerrno>
#include <cstdint>
#include <string_view>

#include "platform/FileDescriptor.h"

namespace norvex {
namespace {

constexpr std::uint32_t kPurchaseDate = 0x70757264;  // "purd"

// An MPEG-4 box: its size in four bytes, its type, its content.
std::string box(std::string_view type, std::string_view content) {
  const std::size_t size = 8 + content.size();
  std::string text;
  for (const int shift : {24, 16, 8, 0}) text += static_cast<char>(size >> shift & 0xFFU);
  return text.append(type).append(content);
}

std::string fileWithPurchase() {
  const std::string versionAndFlags(4, '\0');
  const std::string typeAndLocale = std::string("\0\0\0\1", 4) + std::string(4, '\0');
  const std::string date = box("purd", box("data", typeAndLocale + "2024-01-01 00:00:00"));
  const std::string metadata = box("meta", versionAndFlags + box("ilst", date));
  return box("ftyp", "M4A " + std::string(4, '\0')) + box("moov", box("udta", metadata));
}

}  // namespace

Result<MediaProbe> MediaProbe::in(const std::string& folder) {
  std::string path = folder + "/norvex-XXXXXX";
  const FileDescriptor file(::mkostemp(path.data(), O_CLOEXEC));
  if (!file) return systemError(errno);
  MediaProbe probe(path);
  const std::string bytes = fileWithPurchase();
  const auto written = ::write(file.number(), bytes.data(), bytes.size());
  if (written != static_cast<ssize_t>(bytes.size())) return systemError(written < 0 ? errno : ENOSPC);
  return probe;
}

MediaProbe::~MediaProbe() {
  if (!path_.empty()) ::unlink(path_.c_str());
}

std::vector<MediaItemKey> MediaProbe::keys() {
  return {kPurchaseDate};
}

}  // namespace norvex
