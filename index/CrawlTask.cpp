#include "index/CrawlTask.h"

#include <utility>

namespace norvex {

void CrawlFolderTask::run(CrawlFolderReader& reader) {
  auto folder = reader.enter(path, place);
  if (!folder) {
    error = folder.error();
    return;
  }
  CrawlNames& names = reader.scratchNames();
  const Result<bool> listed = reader.list(folder.value(), names, kMostNameBytes);
  if (listed.ok() && !listed.value()) {
    isLarge = true;
    return;
  }
  if (!listed) error = listed.error();
  reader.readItems(folder.value(), names, 0, names.size(), batch);
  reader.readFolderItself(folder.value(), names, type, batch);
}

void CrawlNamesTask::run(CrawlFolderReader& reader) {
  if (opened == nullptr) {
    auto folder = reader.enter(folder_.path, folder_.place);
    if (!folder) {
      error = folder.error();
      return;
    }
    opened = std::make_shared<CrawlOpenFolder>(CrawlOpenFolder{std::move(folder).value(), {}});
  }
  opened->names = CrawlNames{};
  const Result<bool> listed = reader.list(opened->folder, opened->names, kMostNameBytes);
  if (!listed) error = listed.error();
  isAtEnd = !listed || listed.value();
  reader.readFolderItself(opened->folder, opened->names, folder_.type, batch);
}

void CrawlItemsTask::run(CrawlFolderReader& reader) {
  reader.readItems(opened_->folder, opened_->names, first_, end_, batch);
}

}  // namespace norvex
