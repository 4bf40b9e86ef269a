// The folder of the media file that was read last, kept open: the next one mostly lies beside it, as the
// songs of an album do, and is then found by its name alone.
//
// Of a small folder it also keeps which names were those of regular files, so that the kernel is not asked
// about each. Such a mark is good for one opening. Used by one thread at a time.
#pragma once

#include <array>
#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

#include "platform/FileDescriptor.h"
#include "platform/linux/RegularFile.h"

namespace norvex {

class MediaFolder {
 public:
  // As RegularFile::openAt, of a path of any length. Whatever folder the path leads to by now counts.
  std::optional<RegularFile> openFile(const std::string& path);

 private:
  // Room for some hundred names: more than an album has, and little to look through.
  static constexpr std::size_t kListingSize = std::size_t{8} << 10U;

  void openFolder(std::string_view path);
  void listNames();
  std::optional<RegularFile> openName(const char* name);
  bool takeMarkOfRegularFile(std::string_view name);

  std::string path_;  // with its last separator
  FileDescriptor folder_;
  // As the kernel wrote it, without the marks that were taken.
  alignas(8) std::array<char, kListingSize> listing_;
  std::size_t listingEnd_ = 0;
};

}  // namespace norvex
