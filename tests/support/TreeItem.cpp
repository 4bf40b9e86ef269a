#include "tests/support/TreeItem.h"

#include <utility>

namespace norvex {

TreeItem TreeItem::unreadable(int error) const {
  TreeItem item = *this;
  item.listingError = error;
  return item;
}

TreeItem TreeItem::withoutAttributes(int error) const {
  TreeItem item = *this;
  item.attributeError = error;
  return item;
}

TreeItem TreeItem::failing(ResourceKey key, int error) const {
  TreeItem item = *this;
  item.keyErrors[key] = error;
  return item;
}

TreeItem TreeItem::withoutTotalSize() const {
  TreeItem item = *this;
  item.hasTotalSize = false;
  return item;
}

TreeItem TreeItem::vanishing() const {
  TreeItem item = *this;
  item.hasVanished = true;
  return item;
}

TreeItem file(std::string name, std::uint64_t size) {
  TreeItem item;
  item.name = std::move(name);
  item.kind = TreeItem::Kind::file;
  item.size = size;
  return item;
}

TreeItem folder(std::string name, std::vector<TreeItem> children) {
  TreeItem item;
  item.name = std::move(name);
  item.children = std::move(children);
  return item;
}

TreeItem package(std::string name, std::vector<TreeItem> children) {
  TreeItem item = folder(std::move(name), std::move(children));
  item.kind = TreeItem::Kind::package;
  return item;
}

TreeItem link(std::string name, std::string target, std::uint64_t size) {
  TreeItem item = file(std::move(name), size);
  item.kind = TreeItem::Kind::link;
  item.target = std::move(target);
  return item;
}

}  // namespace norvex
