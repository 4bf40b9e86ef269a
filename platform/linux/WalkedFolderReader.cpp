#include "platform/linux/WalkedFolderReader.h"

#include <fcntl.h>

#include <cerrno>
#include <cstring>

#include "platform/linux/CallablePath.h"
#include "platform/linux/ItemAttributes.h"
#include "platform/linux/PackageMark.h"

namespace norvex {
namespace {

// A link that takes a folder's place between two calls must not lead the walk out of its tree.
constexpr int kOpenFolder = O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC;

// The errno values of a folder that has vanished, or that something else has replaced, since its parent was
// read.
bool meansGone(int error) {
  return error == ENOENT || error == ENOTDIR || error == ELOOP;
}

bool isOwnAncestor(const WalkedFolder& folder) {
  for (const WalkedFolder* above = folder.parent; above != nullptr; above = above->parent) {
    if (above->identity == folder.identity) return true;
  }
  return false;
}

}  // namespace

ReadFolder WalkedFolderReader::read(WalkedFolder& folder, const FileDescriptor& parent) {
  ReadFolder result;
  result.descriptor = FileDescriptor(::openat(parent.number(), folder.name(), kOpenFolder));
  if (!result.descriptor) {
    folder.error = meansGone(errno) ? 0 : errno;
    return result;
  }
  if (marksWanted_) folder.isMarkedAsPackage = isMarkedAsPackage(result.descriptor.number());
  if (isOwnAncestor(folder)) {
    folder.error = ELOOP;
    return result;
  }
  readOpen(folder, result);
  if (meansGone(folder.error)) folder.error = 0;
  return result;
}

ReadFolder WalkedFolderReader::readRoot(WalkedFolder& root, const std::string& path) {
  ReadFolder result;
  const CallablePath callable(withoutTrailingSeparators(path));
  root.error = callable.error();
  if (root.error != 0) return result;
  result.descriptor = FileDescriptor(::openat(callable.folder(), callable.path(), kOpenFolder));
  if (!result.descriptor) {
    root.error = errno;
    return result;
  }
  root.identity = attributesOf(result.descriptor.number()).identity;
  readOpen(root, result);
  return result;
}

void WalkedFolderReader::readOpen(WalkedFolder& folder, ReadFolder& result) {
  forgetHugeFolder();
  items_.clear();
  names_.clear();
  folder.error = listed_.read(result.descriptor.number());
  for (std::size_t position = 0; position < listed_.size(); ++position) {
    readItem(folder, listed_[position], result);
  }
  WalkedFolder* previous = nullptr;
  for (auto place = result.subfolders.begin(); place != result.subfolders.end(); ++place) {
    place->place = place;
    (previous == nullptr ? folder.nextSubfolder : previous->nextSibling) = &*place;
    previous = &*place;
  }
  folder.items.assign(items_.begin(), items_.end());
  folder.names.assign(names_.begin(), names_.end());
}

void WalkedFolderReader::readItem(WalkedFolder& folder, const char* name, ReadFolder& result) {
  const int parent = result.descriptor.number();
  const ItemAttributes attributes = attributesOf(parent, name);
  if (attributes.error == ENOENT) return;  // it has vanished since the folder was listed
  const std::size_t nameStart = names_.size();
  const std::size_t nameLength = std::strlen(name);
  WalkedItem item{0, static_cast<std::uint16_t>(nameLength), static_cast<std::int16_t>(attributes.error),
                  false};
  if (attributes.error == 0) {
    item.isFolder = attributes.isFolder;
    if (attributes.isFolder) {
      result.subfolders.emplace_back(folder, nameStart, attributes.identity);
    } else {
      item.totalSize =
          attributes.isRegularFile ? streams_.totalSize(attributes, parent, name) : attributes.size;
    }
  }
  items_.push_back(item);
  names_.insert(names_.end(), name, name + nameLength + 1);
}

// A huge folder's memory is not kept for the small ones that follow.
void WalkedFolderReader::forgetHugeFolder() {
  constexpr std::size_t kMostItemsKept = 4096;
  if (items_.capacity() <= kMostItemsKept) return;
  listed_ = FolderNames();
  items_ = std::vector<WalkedItem>();
  names_ = std::vector<char>();
}

}  // namespace norvex
