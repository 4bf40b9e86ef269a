// The names of a folder's entries, in byte order.
//
// Holds one folder's names at a time and keeps its memory for the next. Used by one thread.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

namespace norvex {

class FolderNames {
 public:
  // Reads the names of the open folder, without "." and "..", in place of those that were there. Returns 0,
  // or the errno value with which reading ended; then the names that came before are there.
  int read(int folder);

  std::size_t size() const { return sorted_.size(); }

  // The name at a position below size(), valid until the next read().
  const char* operator[](std::size_t position) const { return sorted_[position].name; }

 private:
  // Eight bytes of the name decide nearly every comparison without touching the name itself.
  struct SortedName {
    std::uint64_t head;
    const char* name;
  };

  int readRecords(int folder);
  void collectNames();
  void sort();
  static bool precedes(const SortedName& left, const SortedName& right);

  std::vector<char> records_;  // as the kernel wrote them
  std::size_t recordsEnd_ = 0;
  std::vector<SortedName> sorted_;
};

}  // namespace norvex
