#include "platform/linux/MediaItemList.h"

#include <algorithm>
#include <array>
#include <cstdint>
#include <string>
#include <string_view>
#include <utility>

#include "platform/linux/BoxReader.h"

namespace norvex {
namespace {

// The way from the movie to the item list. Nothing else is ever entered, so its length bounds the depth.
constexpr std::array<std::uint32_t, 3> kWayToItems = {
    boxType("udta"),
    boxType("meta"),
    boxType("ilst"),
};
constexpr std::uint32_t kMovie = boxType("moov");
constexpr std::uint32_t kMetadata = boxType("meta");
constexpr std::uint32_t kFreeForm = boxType("----");
constexpr std::uint32_t kFreeFormDomain = boxType("mean");
constexpr std::uint32_t kFreeFormName = boxType("name");

// One byte of version and three of flags, with which some boxes begin.
constexpr std::uint64_t kVersionLength = 4;

// Most lists are shorter: their keys take one allocation, and one of a size that the C library has at hand.
constexpr std::size_t kUsualItems = 24;

class Walk {
 public:
  explicit Walk(ByteSource& source) : reader_(source) {}

  std::vector<MediaItemKey> keys() {
    const Box file = reader_.file();
    std::uint64_t at = file.begin;
    while (const auto child = reader_.boxAt(at, file)) {
      if (child->type == kMovie) {
        enter(*child, 0);
        break;
      }
      at = child->end;
    }
    return std::move(keys_);
  }

 private:
  bool enter(const Box& parent, std::size_t level);
  void readItems(const Box& list);
  MediaItemKey keyOf(const Box& item);
  std::string freeFormKey(const Box& item);
  std::string text(const Box& box);
  std::uint64_t firstChild(const Box& parent);

  BoxReader reader_;
  std::vector<MediaItemKey> keys_;
};

// Whether there was a list: then the walk is over.
bool Walk::enter(const Box& parent, std::size_t level) {
  if (level == kWayToItems.size()) {
    readItems(parent);
    return true;
  }
  std::uint64_t at = firstChild(parent);
  while (const auto child = reader_.boxAt(at, parent)) {
    if (child->type == kWayToItems[level] && enter(*child, level + 1)) return true;
    at = child->end;
  }
  return false;
}

// The metadata box comes in two forms: with version and flags before its children, and without. Read as the
// header of a child, version and flags are a size of 0 or one that does not fit, or else the size of the real
// first child stands where the type should be, and the first byte of that is 0 for every size below 16 MiB.
std::uint64_t Walk::firstChild(const Box& parent) {
  if (parent.type != kMetadata) return parent.begin;
  const auto start = reader_.bytesAt(parent.begin, kVersionLength);
  const bool startsWithZero = start && bigEndian32(start->data()) == 0;
  if (!startsWithZero) {
    const auto child = reader_.boxAt(parent.begin, parent);
    if (child && child->type >> 24U != 0) return parent.begin;
  }
  return parent.begin + std::min(kVersionLength, parent.end - parent.begin);
}

void Walk::readItems(const Box& list) {
  keys_.reserve(kUsualItems);
  std::uint64_t at = list.begin;
  while (keys_.size() < maxMediaItems) {
    const auto item = reader_.boxAt(at, list);
    if (!item) return;
    keys_.push_back(keyOf(*item));
    at = item->end;
  }
}

MediaItemKey Walk::keyOf(const Box& item) {
  if (item.type == kFreeForm) return freeFormKey(item);
  return item.type;
}

std::string Walk::freeFormKey(const Box& item) {
  std::string domain;
  std::string name;
  std::uint64_t at = item.begin;
  while (const auto child = reader_.boxAt(at, item)) {
    if (child->type == kFreeFormDomain) domain = text(*child);
    if (child->type == kFreeFormName) name = text(*child);
    at = child->end;
  }
  const std::string_view between = domain.empty() || name.empty() ? "" : ":";
  std::string key;
  key.reserve(domain.size() + between.size() + name.size());
  return key.append(domain).append(between).append(name);
}

std::string Walk::text(const Box& box) {
  if (box.end - box.begin <= kVersionLength) return {};
  const std::uint64_t begin = box.begin + kVersionLength;
  const std::uint64_t length = std::min<std::uint64_t>(box.end - begin, maxMediaKeyPart);
  return std::string(reader_.bytesAt(begin, static_cast<std::size_t>(length)).value_or(""));
}

}  // namespace

std::vector<MediaItemKey> mediaItemKeys(ByteSource& source) {
  return Walk(source).keys();
}

}  // namespace norvex
