// The kernel's table of mounts as values, and which of the mounts can be seen.
//
// A plain value once it is read; any thread.
#pragma once

#include <sys/types.h>

#include <map>
#include <string>
#include <vector>

#include "platform/Result.h"

namespace norvex {

struct Mount {
  int id = 0;
  int parentId = 0;
  dev_t device = 0;    // of the file system
  std::string type;    // its kind, such as "ext4" or "fuse.sshfs"
  std::string source;  // what it lies on, such as "/dev/sda1"
  std::string target;  // the mount point, an absolute path without escapes
  bool readOnly = false;
};

class MountTable {
 public:
  // Reads a table in the format of /proc/self/mountinfo. Lines that make no sense are passed over. Fails with
  // the errno value when the file cannot be read.
  static Result<MountTable> read(const std::string& path);

  // In the table's order.
  const std::vector<Mount>& mounts() const { return mounts_; }

  // Whether the mount point of `mount`, one of mounts(), leads to it and not to something that has been
  // mounted over it or over a folder above it.
  bool isVisible(const Mount& mount) const;

 private:
  explicit MountTable(std::vector<Mount> mounts);
  const Mount* nextOnTheWay(int current, const std::string& path) const;

  std::vector<Mount> mounts_;
  // Indices into mounts_ by the mount that they are mounted on. The first mount of all lies on one that is
  // not in the table; such mounts stand under kOutside.
  std::multimap<int, std::size_t> mountedOn_;
};

}  // namespace norvex
