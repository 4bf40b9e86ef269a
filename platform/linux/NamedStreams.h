// The data that files of some file systems hold beside their main stream.
//
// NTFS keeps any number of named streams with a file. Its drivers list them as extended attributes of the
// user's namespace. Everywhere else such attributes are notes about a file and no part of its data.
//
// One object is used by one thread; it remembers the file systems that it has seen.
#pragma once

#include <cstdint>
#include <string_view>
#include <vector>

#include "platform/linux/ItemAttributes.h"

namespace norvex {

class NamedStreams {
 public:
  // Bytes of all streams of a regular file together. Asks the kernel once for each file system and, beyond
  // that, only about files of file systems with named streams. Streams that cannot be read count nothing.
  std::uint64_t totalSize(const ItemAttributes& file, int folder, const char* path) {
    if (file.identity.device != device_) moveTo(file.identity.device, folder, path);
    return hasStreams_ ? file.size + sizeOfStreams(folder, path) : file.size;
  }

  // Bytes of the streams beside the main one.
  static std::uint64_t sizeOfStreams(int folder, const char* path);

  // Whether a mounted file system of this type (as in the table of mounts) keeps named streams.
  static bool isKeptBy(std::string_view fileSystemType);

 private:
  struct Device {
    std::uint64_t device;
    bool hasStreams;
  };

  void moveTo(std::uint64_t device, int folder, const char* path);

  std::uint64_t device_ = 0;  // the one that was asked about last; no file system has the number 0
  bool hasStreams_ = false;
  std::vector<Device> seen_;
};

}  // namespace norvex
