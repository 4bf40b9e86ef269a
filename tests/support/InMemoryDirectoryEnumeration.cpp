#include "tests/support/InMemoryDirectoryEnumeration.h"

#include <algorithm>
#include <cerrno>
#include <utility>

namespace norvex {
namespace {

// One folder that the walk is in.
struct OpenFolder {
  std::string path;  // ends in "/"
  std::vector<const TreeItem*> children;
  std::size_t next = 0;
};

class Enumerator final : public DirectoryEnumerator {
 public:
  Enumerator(const InMemoryFileTree& tree, Location root, bool wantsPackages,
             DirectoryEnumeration::ErrorHandler errorHandler)
      : tree_(tree),
        root_(std::move(root)),
        wantsPackages_(wantsPackages),
        errorHandler_(std::move(errorHandler)) {}

  const Location* next() override {
    current_.reset();  // a caller that keeps the last location is caught by the address sanitizer
    if (!begun_) {
      begun_ = true;
      open(tree_.find(root_.path()), root_);
    } else if (entered_ != nullptr) {
      open(std::exchange(entered_, nullptr), enteredLocation_);
    }
    while (!folders_.empty()) {
      OpenFolder& folder = folders_.back();
      if (folder.next == folder.children.size()) {
        folders_.pop_back();
        continue;
      }
      const TreeItem* item = folder.children[folder.next++];
      if (item->hasVanished) continue;
      return yield(*item, folder.path);
    }
    return nullptr;
  }

  std::uint64_t level() const override { return level_; }

 private:
  void open(const TreeItem* item, const Location& location) {
    const int error = item == nullptr ? ENOENT : !item->isDirectory() ? ENOTDIR : item->listingError;
    if (error != 0) {
      if (!errorHandler_(location, systemError(error))) folders_.clear();
      return;
    }
    OpenFolder folder{location.path(), {}};
    if (folder.path.back() != '/') folder.path += '/';
    for (const TreeItem& child : item->children) folder.children.push_back(&child);
    std::sort(folder.children.begin(), folder.children.end(),
              [](const TreeItem* a, const TreeItem* b) { return a->name < b->name; });
    folders_.push_back(std::move(folder));
  }

  const Location* yield(const TreeItem& item, const std::string& folderPath) {
    ItemFacts facts;
    facts.error = item.attributeError;
    facts.isDirectory = item.isDirectory();
    if (wantsPackages_) facts.isPackage = item.kind == TreeItem::Kind::package;
    facts.totalFileSize = item.size;
    current_ = std::make_unique<Location>(Location::folder(folderPath));
    current_->moveToItem(folderPath.size(), item.name, facts);
    level_ = folders_.size();
    if (item.isDirectory()) {
      entered_ = &item;
      enteredLocation_ = Location::folder(current_->path());
    }
    return current_.get();
  }

  const InMemoryFileTree& tree_;
  Location root_;
  bool wantsPackages_;
  DirectoryEnumeration::ErrorHandler errorHandler_;
  bool begun_ = false;
  std::vector<OpenFolder> folders_;
  const TreeItem* entered_ = nullptr;  // yielded last and to be opened next
  Location enteredLocation_;
  std::unique_ptr<Location> current_;
  std::uint64_t level_ = 0;
};

}  // namespace

std::unique_ptr<DirectoryEnumerator> InMemoryDirectoryEnumeration::enumerator(
    const Location& root, std::span<const ResourceKey> prefetch, ErrorHandler errorHandler) {
  calls_.add("enumerate " + root.path());
  walks.push_back({root.path(), root.isFolder(), {prefetch.begin(), prefetch.end()}});
  const bool wantsPackages =
      std::find(prefetch.begin(), prefetch.end(), ResourceKey::IsPackage) != prefetch.end();
  return std::make_unique<Enumerator>(tree_, root, wantsPackages, std::move(errorHandler));
}

}  // namespace norvex
