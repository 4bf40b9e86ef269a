// Some items of one folder, as the crawl's workers hand them to its writer.
//
// A plain value, filled by one worker and then read by the writer.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "index/ContentTypes.h"
#include "index/StoragePosition.h"

namespace norvex {

enum class CrawlItemKind : std::uint8_t { file, otherNoFolder, folder, border };

struct CrawledItem {
  std::uint32_t nameStart = 0;  // in CrawlBatch::names
  std::uint16_t nameLength = 0;
  CrawlItemKind kind = CrawlItemKind::file;           // border: a folder that is not entered
  StoragePosition position = StoragePosition::other;  // of regular files
  TypeId type = 0;
  std::int64_t size = 0;   // bytes; of folders meaningless
  std::int64_t mtime = 0;  // nanoseconds since 1970
};

struct CrawledAttribute {
  static constexpr std::uint32_t kFolderItself = UINT32_MAX;

  std::uint32_t item = kFolderItself;  // which of CrawlBatch::items
  std::string name;
  std::string value;
};

// An item that could not be read: it is told, and the crawl goes on.
struct CrawlProblem {
  std::string path;
  int code = 0;  // errno
};

// The first of several problems, and how many there were.
struct CrawlProblems {
  static constexpr std::size_t kMostKept = 20;

  std::uint64_t count = 0;
  std::vector<CrawlProblem> first;

  void add(std::string path, int code) {
    ++count;
    if (first.size() < kMostKept) first.push_back({std::move(path), code});
  }
  void add(const CrawlProblems& others) {
    for (const CrawlProblem& problem : others.first) {
      if (first.size() < kMostKept) first.push_back(problem);
    }
    count += others.count;
  }
};

struct CrawlBatch {
  std::string names;
  std::vector<CrawledItem> items;
  std::vector<CrawledAttribute> attributes;
  CrawlProblems problems;

  std::string_view nameOf(const CrawledItem& item) const {
    return std::string_view(names).substr(item.nameStart, item.nameLength);
  }
  std::size_t bytes() const;
};

// About what the batch takes of memory.
inline std::size_t CrawlBatch::bytes() const {
  std::size_t sum = names.capacity() + items.capacity() * sizeof(CrawledItem);
  for (const CrawledAttribute& attribute : attributes) sum += sizeof attribute + attribute.value.capacity();
  return sum;
}

}  // namespace norvex
