#include "tests/support/InMemoryFileTree.h"

#include <algorithm>
#include <utility>
#include <vector>

namespace norvex {
namespace {

constexpr int kMostLinksInARow = 8;

std::vector<std::string_view> components(std::string_view path) {
  std::vector<std::string_view> parts;
  while (!path.empty()) {
    const std::size_t end = std::min(path.find('/'), path.size());
    if (end > 0) parts.push_back(path.substr(0, end));
    path.remove_prefix(std::min(end + 1, path.size()));
  }
  return parts;
}

// `Item` is TreeItem, constant or not.
template <typename Item>
Item* childNamed(Item& parent, std::string_view name) {
  const auto found = std::find_if(parent.children.begin(), parent.children.end(),
                                  [&](const TreeItem& child) { return child.name == name; });
  return found == parent.children.end() ? nullptr : &*found;
}

}  // namespace

void InMemoryFileTree::put(std::string_view folderPath, TreeItem item) {
  TreeItem* parent = &root_;
  for (const std::string_view name : components(folderPath)) {
    TreeItem* child = childNamed(*parent, name);
    if (child == nullptr) child = &parent->children.emplace_back(folder(std::string(name)));
    parent = child;
  }
  if (TreeItem* old = childNamed(*parent, item.name)) {
    *old = std::move(item);
  } else {
    parent->children.push_back(std::move(item));
  }
}

const TreeItem* InMemoryFileTree::find(std::string_view path) const {
  const TreeItem* item = &root_;
  for (const std::string_view name : components(path)) {
    item = childNamed(*item, name);
    if (item == nullptr || item->hasVanished) return nullptr;
  }
  return item;
}

const TreeItem* InMemoryFileTree::follow(std::string_view path) const {
  const TreeItem* item = find(path);
  for (int links = 0; item != nullptr && item->kind == TreeItem::Kind::link; ++links) {
    if (links == kMostLinksInARow) return nullptr;
    item = find(item->target);
  }
  return item;
}

}  // namespace norvex
