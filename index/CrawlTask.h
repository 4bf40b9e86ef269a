// Pieces of a crawl's work that may be done ahead of their turn, on any worker: reading one small folder,
// reading the names of a large one, reading some items of a large one.
//
// A task is filled in by the writer, run by one worker, and read by the writer once it is done.
#pragma once

#include <atomic>
#include <cstddef>
#include <memory>
#include <optional>
#include <string>

#include "index/CrawlBatch.h"
#include "index/CrawlFolderReader.h"
#include "index/CrawlRules.h"

namespace norvex {

class CrawlTask {
 public:
  virtual ~CrawlTask() = default;
  virtual void run(CrawlFolderReader& reader) = 0;

  CrawlBatch batch;
  std::optional<Error> error;  // the folder could not be opened, or not be read to its end

 private:
  friend class CrawlWorkers;
  std::atomic<bool> isDone_{false};
};

// A folder that a later task reads on.
struct CrawlOpenFolder {
  CrawlFolder folder;
  CrawlNames names;
};

// Reads a folder as a whole. One that takes more than `mostNameBytes` is only opened: its names are left to
// CrawlNamesTask, because its turn may be far away and memory is not to fill with what waits.
class CrawlFolderTask final : public CrawlTask {
 public:
  static constexpr std::size_t kMostNameBytes = 32 * 1024;

  CrawlFolderTask(std::string folderPath, const CrawlPlace& folderPlace, TypeId folderType)
      : path(std::move(folderPath)), place(folderPlace), type(folderType) {}
  void run(CrawlFolderReader& reader) override;

  const std::string path;
  const CrawlPlace place;
  const TypeId type;
  bool isLarge = false;
};

// Reads the next names of a large folder, as many as memory is kept for. The first run opens it.
class CrawlNamesTask final : public CrawlTask {
 public:
  static constexpr std::size_t kMostNameBytes = 16 * 1024 * 1024;

  CrawlNamesTask(const CrawlFolderTask& folder, std::shared_ptr<CrawlOpenFolder> before)
      : opened(std::move(before)), folder_(folder) {}
  void run(CrawlFolderReader& reader) override;

  std::shared_ptr<CrawlOpenFolder> opened;
  bool isAtEnd = false;

 private:
  const CrawlFolderTask& folder_;
};

// Reads the items [first, end) of the names of a large folder.
class CrawlItemsTask final : public CrawlTask {
 public:
  static constexpr std::size_t kItems = 1024;

  CrawlItemsTask(std::shared_ptr<const CrawlOpenFolder> opened, std::size_t first, std::size_t end)
      : opened_(std::move(opened)), first_(first), end_(end) {}
  void run(CrawlFolderReader& reader) override;

 private:
  std::shared_ptr<const CrawlOpenFolder> opened_;
  std::size_t first_, end_;
};

}  // namespace norvex
