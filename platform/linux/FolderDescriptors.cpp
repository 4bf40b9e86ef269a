#include "platform/linux/FolderDescriptors.h"

#include <fcntl.h>

#include <algorithm>
#include <cassert>
#include <cerrno>

namespace norvex {
namespace {
constexpr std::size_t kLowestLimit = 4;
}

void FolderDescriptors::keep(WalkedFolder& folder, FileDescriptor descriptor) {
  hold(folder, std::make_shared<const FileDescriptor>(std::move(descriptor)));
}

FolderDescriptors::Descriptor FolderDescriptors::parentOf(WalkedFolder& folder, int& error) {
  assert(folder.parent != nullptr);
  WalkedFolder& parent = *folder.parent;
  error = parent.descriptor ? 0 : reopen(parent);
  if (error == EMFILE || error == ENFILE) {
    makeRoom();
    error = reopen(parent);
  }
  Descriptor descriptor = parent.descriptor;
  --parent.unopenedSubfolders;
  // The root stays open: it is where the way back to any other folder begins.
  if (parent.unopenedSubfolders == 0 && parent.parent != nullptr) letGo(parent);
  return descriptor;
}

void FolderDescriptors::letGo(WalkedFolder& folder) {
  folder.descriptor = nullptr;
  // The folders that are being left are the ones that were opened last.
  const auto place = std::find(open_.rbegin(), open_.rend(), &folder);
  if (place != open_.rend()) open_.erase(std::next(place).base());
}

void FolderDescriptors::makeRoom() {
  limit_ = std::max(kLowestLimit, std::min(limit_, open_.size()) / 2);
  closeFirst(open_.size());
}

void FolderDescriptors::hold(WalkedFolder& folder, Descriptor descriptor) {
  folder.descriptor = std::move(descriptor);
  if (folder.parent == nullptr) return;
  if (open_.size() >= limit_) closeFirst(open_.size() - limit_ + 1);
  open_.push_back(&folder);
}

void FolderDescriptors::closeFirst(std::size_t count) {
  const auto end = open_.begin() + static_cast<std::ptrdiff_t>(count);
  for (auto place = open_.begin(); place != end; ++place) {
    WalkedFolder& folder = **place;
    folder.identityWhenClosed = attributesOf(folder.descriptor->number()).identity;
    folder.descriptor = nullptr;
  }
  open_.erase(open_.begin(), end);
}

int FolderDescriptors::reopen(WalkedFolder& folder) {
  std::vector<WalkedFolder*> closed;
  WalkedFolder* lowestOpen = &folder;
  while (!lowestOpen->descriptor) {
    assert(lowestOpen->parent != nullptr && "the root stays open");
    closed.push_back(lowestOpen);
    lowestOpen = lowestOpen->parent;
  }

  // The way back goes through the folders just above next, so these stay open as well: else leaving a tree
  // that is n folders deep would take n * n / 2 steps.
  const std::size_t kept = limit_ - limit_ / 4;
  Descriptor above = lowestOpen->descriptor;
  for (std::size_t left = closed.size(); left > 0; --left) {
    WalkedFolder& next = *closed[left - 1];
    constexpr int kFlags = O_PATH | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC;
    FileDescriptor descriptor(::openat(above->number(), next.name(), kFlags));
    if (!descriptor) return errno;
    const bool isAwaited = next.unopenedSubfolders > 0 && left <= kept;
    if (isAwaited && attributesOf(descriptor.number()).identity != next.identityWhenClosed) return ENOENT;
    above = std::make_shared<const FileDescriptor>(std::move(descriptor));
    if (isAwaited) hold(next, above);
  }
  return 0;
}

}  // namespace norvex
