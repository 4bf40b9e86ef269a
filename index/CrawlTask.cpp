#include "index/CrawlTask.h"

#include <algorithm>
#include <utility>

#include "index/FolderRules.h"

namespace norvex {
namespace {

// What one task may hand over. Also bounds how deep it goes: every folder takes some.
constexpr std::size_t kMostBytes = std::size_t{32} << 10U;

bool isFolder(const CrawledItem& item) {
  return item.kind == CrawlItemKind::folder;
}

}  // namespace

void CrawlFolderTask::run(CrawlFolderReader& reader) {
  std::size_t bytesLeft = kMostBytes;
  read(reader, bytesLeft);
}

void CrawlFolderTask::read(CrawlFolderReader& reader, std::size_t& bytesLeft) {
  auto folder = reader.enter(path, place, around);
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
  bytesLeft -= std::min(bytesLeft, batch.bytes() + sizeof *this);
  const bool hasFolders = std::any_of(batch.items.begin(), batch.items.end(), isFolder);
  if (!hasFolders) return;
  kept = reader.keep(std::move(folder).value());
  readInside(reader, bytesLeft);
}

void CrawlFolderTask::readInside(CrawlFolderReader& reader, std::size_t& bytesLeft) {
  MaildirSigns maildir;
  for (const CrawledItem& item : batch.items) {
    if (item.kind == CrawlItemKind::folder || item.kind == CrawlItemKind::border)
      maildir.seeFolder(batch.nameOf(item));
  }
  for (const CrawledItem& item : batch.items) {
    if (!isFolder(item)) continue;
    if (bytesLeft == 0 || inside.size() == kMostInside) return;
    const std::string_view name = batch.nameOf(item);
    std::string itsPath = path.empty() ? std::string(name) : path + "/" + std::string(name);
    const CrawlPlace itsPlace = reader.placeInside(itsPath, name, place, maildir.isMaildir());
    inside.push_back(std::make_shared<CrawlFolderTask>(std::move(itsPath), itsPlace, item.type, kept));
    inside.back()->read(reader, bytesLeft);
    inside.back()->setDone();
  }
  kept.reset();
}

std::size_t CrawlFolderTask::bytes() const {
  std::size_t sum = batch.bytes();
  for (const auto& task : inside) sum += task->bytes();
  return sum;
}

void CrawlNamesTask::run(CrawlFolderReader& reader) {
  if (opened == nullptr) {
    auto folder = reader.enter(folder_.path, folder_.place, folder_.around);
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
