// Reads folders of one volume: their names, what the file system says of each item, and the attributes that
// items carry or get from a rule.
//
// One reader a worker thread, which it keeps on: the thread's current folder changes with the folder that is
// read.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "index/CrawlBatch.h"
#include "index/CrawlRules.h"
#include "index/CrawlVolume.h"
#include "platform/FileDescriptor.h"
#include "platform/Result.h"

struct statx;

namespace norvex {

// A folder that is being read. Its names are read on from where the last reading stopped.
struct CrawlFolder {
  std::string path;      // below the volume's root, which is empty itself
  std::string absolute;  // what its items' places are told by
  CrawlPlace place;
  FileDescriptor fd;
};

// Names of items of one folder, each ending in a NUL.
struct CrawlNames {
  std::string bytes;
  std::vector<std::uint32_t> starts;

  const char* at(std::size_t index) const { return bytes.data() + starts[index]; }
  std::size_t size() const { return starts.size(); }
  bool contains(std::string_view name) const;  // of sorted names
};

class CrawlFolderReader {
 public:
  // Whether the thread may be given a current folder of its own, which makes the reading of attributes
  // faster.
  enum class CurrentFolder { own, shared };

  // Both outlive the reader.
  CrawlFolderReader(const CrawlVolume& volume, const CrawlRules& rules);

  // errno on failure; EXDEV for a folder in which another volume, or a read-only snapshot, begins.
  Result<CrawlFolder> enter(const std::string& path, const CrawlPlace& place, const KeptFolder& around);

  // Keeps a folder open for those in it, unless too many are.
  KeptFolder keep(CrawlFolder folder) const { return volume_.keep(std::move(folder.fd)); }

  // What the folder at `path` below the root passes on to its items.
  CrawlPlace placeInside(std::string_view path, std::string_view name, const CrawlPlace& around,
                         bool inMaildir) const {
    return rules_.placeInside(volume_.absolute(path), name, around, inMaildir);
  }

  // Empty names, in memory that is used again and again.
  CrawlNames& scratchNames();

  // Appends names until there are no more, or until they take about `mostBytes`, and sorts them. True at the
  // folder's end. errno on failure; what was read until then stands in `names`.
  Result<bool> list(CrawlFolder& folder, CrawlNames& names, std::size_t mostBytes);

  // Adds the items [first, end) of `names`. Items that have vanished are left out; unreadable ones are told.
  void readItems(const CrawlFolder& folder, const CrawlNames& names, std::size_t first, std::size_t end,
                 CrawlBatch& batch);

  // Adds what the folder is given for what is in it. `type`: the folder's own.
  void readFolderItself(const CrawlFolder& folder, const CrawlNames& names, TypeId type, CrawlBatch& batch);

  // The root has no folder around it in which it could be read.
  CrawledItem readRoot(CrawlFolder& root, CrawlBatch& batch);

 private:
  struct OwnAttributes {
    bool isMarkedPackage = false;
  };

  void makeCurrent(const CrawlFolder& folder);
  void readItem(const CrawlFolder& folder, std::string_view name, const char* nameEnd, CrawlBatch& batch);
  OwnAttributes readAttributes(const CrawlFolder& folder, const char* name, bool isFolder, std::uint32_t item,
                               CrawlBatch& batch);
  ssize_t listAttributes(const char* path);
  std::string_view readValue(const CrawlFolder& folder, const char* name, const char* attribute,
                             CrawlBatch& batch);
  bool carriesCacheTag(const CrawlFolder& folder) const;
  const char* attributePath(const CrawlFolder& folder, const char* name);

  const CrawlVolume& volume_;
  const CrawlRules& rules_;
  bool hasOwnCurrentFolder_;
  bool isCurrent_ = false;  // of the folder whose items are being read
  bool expectsAttributes_ = false;
  CrawlNames scratchNames_;
  std::string attributePath_;
  std::vector<char> entries_, attributeNames_, attributeValue_;
};

}  // namespace norvex
