#include "platform/linux/LinuxDirectoryEnumeration.h"

#include <algorithm>
#include <utility>

#include "platform/PackageNames.h"
#include "platform/linux/ReadAhead.h"

namespace norvex {
namespace {

class LinuxDirectoryEnumerator final : public DirectoryEnumerator {
 public:
  LinuxDirectoryEnumerator(const Location& root, bool packagesWanted,
                           DirectoryEnumeration::ErrorHandler errorHandler)
      : readAhead_(root.path(), packagesWanted),
        packagesWanted_(packagesWanted),
        errorHandler_(std::move(errorHandler)),
        location_(root),
        toEnter_(&readAhead_.root()) {}

  const Location* next() override {
    if (toEnter_ != nullptr) enter(*std::exchange(toEnter_, nullptr));
    while (current_ != nullptr) {
      if (current_->nextItem < current_->items.size()) {
        yieldItem(*current_);
        return &location_;
      }
      leave();
    }
    return nullptr;
  }

  std::uint64_t level() const override { return level_; }

 private:
  void enter(WalkedFolder& folder);
  void leave();
  void yieldItem(WalkedFolder& folder);
  bool isPackage(WalkedFolder& folder, std::string_view name);

  ReadAhead readAhead_;
  const bool packagesWanted_;
  const DirectoryEnumeration::ErrorHandler errorHandler_;
  Location location_;
  std::uint64_t level_ = 0;
  WalkedFolder* current_ = nullptr;  // whose items are being yielded; nullptr: the walk is over
  WalkedFolder* toEnter_;            // the folder that was yielded last, or the root
  bool toEnterIsRead_ = false;
};

void LinuxDirectoryEnumerator::enter(WalkedFolder& folder) {
  if (!std::exchange(toEnterIsRead_, false)) readAhead_.await(folder);
  current_ = &folder;
  if (folder.error != 0 && errorHandler_ && !errorHandler_(location_, systemError(folder.error))) {
    current_ = nullptr;
    return;
  }
  if (folder.items.empty()) return;
  folder.depth = folder.parent == nullptr ? 0 : folder.parent->depth + 1;
  // The path so far is the folder's own; what it needs is a separator before its items' names.
  const std::string& path = location_.path();
  if (path.empty() || path.back() != '/') location_.moveToItem(path.size(), "/", ItemFacts());
  folder.pathLength = path.size();
}

void LinuxDirectoryEnumerator::leave() {
  WalkedFolder* parent = current_->parent;
  readAhead_.discard(*std::exchange(current_, parent));
}

void LinuxDirectoryEnumerator::yieldItem(WalkedFolder& folder) {
  const WalkedItem& item = folder.items[folder.nextItem++];
  const std::string_view name(folder.names.data() + folder.nextName, item.nameLength);
  folder.nextName += name.size() + 1;
  ItemFacts facts;
  facts.error = item.error;
  facts.isDirectory = item.isFolder;
  facts.totalFileSize = item.totalSize;
  if (item.isFolder) {
    toEnter_ = folder.nextSubfolder;
    folder.nextSubfolder = toEnter_->nextSibling;
  }
  if (packagesWanted_) facts.isPackage = item.isFolder && isPackage(*toEnter_, name);
  level_ = folder.depth + 1;
  location_.moveToItem(folder.pathLength, name, facts);
}

// The mark of a package is read with the folder that carries it, which is the next one to be read anyway.
bool LinuxDirectoryEnumerator::isPackage(WalkedFolder& folder, std::string_view name) {
  if (isPackageName(name)) return true;
  readAhead_.await(folder);
  toEnterIsRead_ = true;
  return folder.isMarkedAsPackage;
}

}  // namespace

std::unique_ptr<DirectoryEnumerator> LinuxDirectoryEnumeration::enumerator(
    const Location& root, std::span<const ResourceKey> prefetch, ErrorHandler errorHandler) {
  const bool packagesWanted =
      std::find(prefetch.begin(), prefetch.end(), ResourceKey::IsPackage) != prefetch.end();
  return std::make_unique<LinuxDirectoryEnumerator>(root, packagesWanted, std::move(errorHandler));
}

}  // namespace norvex
