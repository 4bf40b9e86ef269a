#include "platform/linux/FolderNames.h"

#include <dirent.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <string_view>

namespace norvex {
namespace {

// Room for the entries of an ordinary folder in one call.
constexpr std::size_t kUsualSize = std::size_t{128} << 10U;
// The least that is offered to the kernel: an entry must fit, and a large folder should take few calls.
constexpr std::size_t kLeastRoom = std::size_t{64} << 10U;

bool isSelfOrParent(const char* name) {
  return name[0] == '.' && (name[1] == '\0' || (name[1] == '.' && name[2] == '\0'));
}

std::size_t lengthOfCommonStart(const char* left, const char* right, std::size_t limit) {
  std::size_t length = 0;
  while (length < limit && left[length] == right[length]) ++length;
  return length;
}

// The bytes of `text` up to the eighth, as a number that compares like them.
std::uint64_t headOf(const char* text) {
  std::uint64_t head = 0;
  int shift = 56;
  for (; shift >= 0 && *text != '\0'; shift -= 8, ++text) {
    head |= std::uint64_t{static_cast<unsigned char>(*text)} << static_cast<unsigned>(shift);
  }
  return head;
}

}  // namespace

int FolderNames::read(int folder) {
  sorted_.clear();
  const int error = readRecords(folder);
  collectNames();
  sort();
  return error;
}

int FolderNames::readRecords(int folder) {
  if (records_.empty()) records_.resize(kUsualSize);
  recordsEnd_ = 0;
  for (;;) {
    if (records_.size() - recordsEnd_ < kLeastRoom) records_.resize(records_.size() * 2);
    const ssize_t length = ::getdents64(folder, records_.data() + recordsEnd_, records_.size() - recordsEnd_);
    if (length <= 0) return length == 0 ? 0 : errno;
    recordsEnd_ += static_cast<std::size_t>(length);
  }
}

void FolderNames::collectNames() {
  for (std::size_t position = 0; position < recordsEnd_;) {
    const char* record = records_.data() + position;
    unsigned short length = 0;
    std::memcpy(&length, record + offsetof(dirent64, d_reclen), sizeof length);
    const char* name = record + offsetof(dirent64, d_name);
    if (!isSelfOrParent(name)) sorted_.push_back({0, name});
    position += length;
  }
}

void FolderNames::sort() {
  if (sorted_.size() < 2) return;
  // Names of large folders often begin alike ("IMG_"): the eight bytes are taken where they begin to differ.
  std::size_t start = std::strlen(sorted_.front().name);
  for (const SortedName& entry : sorted_) {
    if (start == 0) break;
    start = lengthOfCommonStart(sorted_.front().name, entry.name, start);
  }
  for (SortedName& entry : sorted_) entry.head = headOf(entry.name + start);
  std::sort(sorted_.begin(), sorted_.end(), precedes);
}

bool FolderNames::precedes(const SortedName& left, const SortedName& right) {
  if (left.head != right.head) return left.head < right.head;
  return std::strcmp(left.name, right.name) < 0;
}

}  // namespace norvex
