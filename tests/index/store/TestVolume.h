// A folder tree that stands for a volume, and a cache folder for its store, both gone with the scope.
#pragma once

#include <atomic>
#include <functional>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "index/IndexUpdate.h"
#include "index/StoreReader.h"

namespace norvex {

class TestVolume {
 public:
  TestVolume();
  ~TestVolume();
  TestVolume(const TestVolume&) = delete;
  TestVolume& operator=(const TestVolume&) = delete;

  const std::string& root() const { return root_; }
  const StoreFolder& stores() const { return stores_; }
  std::string at(std::string_view path) const { return root_ + "/" + std::string(path); }
  std::string storePath() const { return stores_.storePath(root_); }

  // Each makes the folders around it.
  void folder(std::string_view path) const;
  void file(std::string_view path, std::string_view content = "") const;
  void link(std::string_view path, std::string_view target) const;
  // False where the file system under the tests has no extended attributes.
  bool attribute(std::string_view path, const char* name, std::string_view value) const;

  static const CrawlRules& rules();

  Result<IndexUpdateSummary> update(const IndexUpdateOptions& options = {}) const;
  Result<std::unique_ptr<StoreReader>> open() const { return StoreReader::open(stores_, root_); }

  // All items as "path" lines, in the store's order; the error's text when there is one.
  std::vector<std::string> paths() const;

  // Runs SQL on the store's file as if it had been written so, and seals it again.
  void tamper(const char* sql) const;

 private:
  std::string base_;
  std::string root_;
  StoreFolder stores_;
};

// A value as text, to be compared with another.
std::string told(const std::optional<MetadataValue>& value);

// What a child process told, or how it ended.
struct ChildEnd {
  int status = 0;  // of wait()
  bool isClean() const { return status == 0; }
};

// Runs `body` in a child process, which ends with what it returns.
ChildEnd inChild(const std::function<int()>& body);

// Whether a file system can be mounted in a child's own view of the mounts; in that child, from now on.
bool enterOwnMounts();

}  // namespace norvex
