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
#include <vector>

#include "index/CrawlBatch.h"
#include "index/CrawlFolderReader.h"
#include "index/CrawlRules.h"

namespace norvex {

class CrawlTask {
 public:
  virtual ~CrawlTask() = default;
  virtual void run(CrawlFolderReader& reader) = 0;

  // About the memory that its results take, in bytes.
  virtual std::size_t bytes() const { return batch.bytes(); }

  CrawlBatch batch;
  std::optional<Error> error;  // the folder could not be opened, or not be read to its end

 protected:
  void setDone() { isDone_.store(true); }

 private:
  friend class CrawlWorkers;
  std::atomic<bool> isDone_{false};
};

// A folder that a later task reads on.
struct CrawlOpenFolder {
  CrawlFolder folder;
  CrawlNames names;
};

// Reads a folder as a whole, and then folders in it, depth first, as long as their items take little memory:
// most folders are small, and to be handed over one by one would cost more than to be read. A folder that
// takes more than `kMostNameBytes` is only opened: its names are left to CrawlNamesTask, because its turn may
// be far away and memory is not to fill with what waits.
class CrawlFolderTask final : public CrawlTask {
 public:
  static constexpr std::size_t kMostNameBytes = std::size_t{32} << 10U;
  static constexpr std::size_t kMostInside = 64;

  CrawlFolderTask(std::string folderPath, const CrawlPlace& folderPlace, TypeId folderType,
                  KeptFolder keptAround)
      : path(std::move(folderPath)), place(folderPlace), type(folderType), around(std::move(keptAround)) {}
  void run(CrawlFolderReader& reader) override;
  std::size_t bytes() const override;

  const std::string path;
  const CrawlPlace place;
  const TypeId type;
  const KeptFolder around;  // the folder that it is in; may be empty
  KeptFolder kept;          // the folder itself, when further folders in it are going to be read
  bool isLarge = false;
  std::vector<std::shared_ptr<CrawlFolderTask>> inside;  // done: the first of the folders in it

 private:
  void read(CrawlFolderReader& reader, std::size_t& bytesLeft);
  void readInside(CrawlFolderReader& reader, std::size_t& bytesLeft);
};

// Reads the next names of a large folder, as many as memory is kept for. The first run opens it.
class CrawlNamesTask final : public CrawlTask {
 public:
  static constexpr std::size_t kMostNameBytes = std::size_t{16} << 20U;

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
