#include "platform/linux/MountTable.h"

#include <libmount.h>

#include <cerrno>
#include <memory>
#include <set>
#include <string_view>
#include <utility>

#include "platform/linux/Files.h"

namespace norvex {
namespace {

// No mount's own id.
constexpr int kOutside = -1;

struct Unreference {
  void operator()(libmnt_table* table) const { mnt_unref_table(table); }
  void operator()(libmnt_iter* iterator) const { mnt_free_iter(iterator); }
};
using Table = std::unique_ptr<libmnt_table, Unreference>;
using Iterator = std::unique_ptr<libmnt_iter, Unreference>;

std::string text(const char* field) {
  return field == nullptr ? std::string() : std::string(field);
}

Mount mountOf(libmnt_fs* entry) {
  Mount mount;
  mount.id = mnt_fs_get_id(entry);
  mount.parentId = mnt_fs_get_parent_id(entry);
  mount.device = mnt_fs_get_devno(entry);
  mount.type = text(mnt_fs_get_fstype(entry));
  mount.source = text(mnt_fs_get_source(entry));
  mount.target = text(mnt_fs_get_target(entry));
  // Of the mount or of the file system: either makes it read-only here.
  mount.readOnly = mnt_fs_match_options(entry, "ro") == 1;
  return mount;
}

bool isAtOrBelow(std::string_view path, std::string_view folder) {
  if (folder == "/") return true;
  return path.starts_with(folder) && (path.size() == folder.size() || path[folder.size()] == '/');
}

}  // namespace

Result<MountTable> MountTable::read(const std::string& path) {
  // The library takes a file that is not there for an empty table.
  if (const Result<std::string> readable = readStartOfFile(path, 1); !readable) return readable.error();
  const Table table(mnt_new_table());
  const Iterator iterator(mnt_new_iter(MNT_ITER_FORWARD));
  if (!table || !iterator) return systemError(ENOMEM);
  const auto passOver = [](libmnt_table*, const char*, int) { return 1; };
  mnt_table_set_parser_errcb(table.get(), passOver);
  if (const int status = mnt_table_parse_file(table.get(), path.c_str()); status != 0) {
    return systemError(status < 0 ? -status : EINVAL);
  }
  std::vector<Mount> mounts;
  libmnt_fs* entry = nullptr;
  while (mnt_table_next_fs(table.get(), iterator.get(), &entry) == 0) mounts.push_back(mountOf(entry));
  return MountTable(std::move(mounts));
}

MountTable::MountTable(std::vector<Mount> mounts) : mounts_(std::move(mounts)) {
  std::set<int> ids;
  for (const Mount& mount : mounts_) ids.insert(mount.id);
  for (std::size_t index = 0; index < mounts_.size(); ++index) {
    const Mount& mount = mounts_[index];
    const bool isInside = mount.parentId != mount.id && ids.contains(mount.parentId);
    mountedOn_.emplace(isInside ? mount.parentId : kOutside, index);
  }
}

// The mount that is entered next on the way from the mount `current` to `path`, nullptr when there is none:
// of those mounted on it along the path the one that is met first. At one place the latest lies on top.
const Mount* MountTable::nextOnTheWay(int current, const std::string& path) const {
  const Mount* next = nullptr;
  const auto [first, last] = mountedOn_.equal_range(current);
  for (auto entry = first; entry != last; ++entry) {
    const Mount& candidate = mounts_[entry->second];
    if (!isAtOrBelow(path, candidate.target)) continue;
    if (next == nullptr || candidate.target.size() <= next->target.size()) next = &candidate;
  }
  return next;
}

bool MountTable::isVisible(const Mount& mount) const {
  int current = kOutside;
  // A table that makes no sense may lead in circles; no way is longer than the table.
  for (std::size_t step = 0; step <= mounts_.size(); ++step) {
    const Mount* next = nextOnTheWay(current, mount.target);
    if (next == nullptr) break;
    current = next->id;
  }
  return current == mount.id;
}

}  // namespace norvex
