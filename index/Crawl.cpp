#include "index/Crawl.h"

#include <algorithm>
#include <cerrno>
#include <deque>
#include <memory>
#include <thread>
#include <utility>
#include <vector>

#include "index/CrawlWorkers.h"
#include "index/FolderRules.h"

namespace norvex {
namespace {

// How far a folder's subfolders are known ahead, how many folders on the way down are looked at for such.
constexpr std::size_t kKnownAhead = CrawlFolderTask::kMostInside;
constexpr std::size_t kFoldersLookedAhead = 64;
constexpr std::size_t kFewWaiting = 32;  // below this more is given, so that no helper is ever idle
constexpr std::size_t kMostWaiting = 128;
// What has been read ahead takes at most this; the last part of it is kept for what comes next.
constexpr std::size_t kMostHeldBytes = std::size_t{8} << 20U;
constexpr std::size_t kMostHeldBytesOfOthers = std::size_t{4} << 20U;
constexpr std::size_t kNextFolders = 2;

// A subfolder whose turn comes.
struct Child {
  std::int64_t id = 0;
  std::string name;
  TypeId type = 0;
  std::shared_ptr<CrawlFolderTask> task;  // once it is being read ahead
};

// A folder whose items have been written and whose subfolders have not all been crawled.
struct Frame {
  std::size_t pathLength = 0;
  CrawlPlace place;
  KeptFolder kept;  // while there are few such
  MaildirSigns maildir;
  std::deque<Child> next;
  std::size_t given = 0;      // how many of these are being read ahead
  std::int64_t lookFrom = 0;  // further subfolders are among the items [lookFrom, lookEnd)
  std::int64_t lookEnd = 0;
};

class Crawl {
 public:
  Crawl(const CrawlVolume& volume, const CrawlRules& rules, std::size_t helpers, StoreWriter& store,
        const CrawlProgress& progress, const std::atomic<bool>& cancelled)
      : volume_(volume),
        rules_(rules),
        store_(store),
        progress_(progress),
        cancelled_(cancelled),

        workers_(volume, rules, helpers),
        threads_(helpers + 1) {}

  Result<CrawlFigures> run() {
    if (const auto root = crawlRoot(); !root) return root.error();
    while (!frames_.empty()) {
      if (const auto advanced = advance(); !advanced) return advanced.error();
    }
    writeTypes();
    if (const auto status = store_.status(); !status) return status.error();
    return std::move(figures_);
  }

 private:
  Result<void> crawlRoot() {
    CrawlFolderReader reader(volume_, rules_);
    auto root = reader.enter("", CrawlPlace{}, nullptr);
    if (!root) return root.error();
    CrawlBatch batch;
    const CrawledItem item = reader.readRoot(root.value(), batch);
    noteFolderType(item.type);
    store_.add({0, {}, item.type, std::nullopt, item.mtime});
    writeAttributes(batch, kRootItem, 0);
    Child child{kRootItem, {}, item.type, nullptr};
    const std::string name = volume_.root().substr(volume_.root().rfind('/') + 1);
    const CrawlPlace place = rules_.placeInside(volume_.root(), name, CrawlPlace{}, false);
    child.task = std::make_shared<CrawlFolderTask>(std::string(), place, item.type, nullptr);
    workers_.give({child.task});
    return crawlFolder(std::move(child));
  }

  // One step: crawls the next subfolder of the deepest folder, or leaves that.
  Result<void> advance() {
    if (frames_.back().next.empty()) {
      if (auto filled = refill(frames_.back()); !filled) return filled;
    }
    if (frames_.back().next.empty()) {
      frames_.pop_back();
      return {};
    }
    readAhead();
    Child child = std::move(frames_.back().next.front());
    frames_.back().next.pop_front();
    --frames_.back().given;
    return crawlFolder(std::move(child));
  }

  Result<void> refill(Frame& frame) {
    if (frame.lookFrom >= frame.lookEnd) return {};
    auto found = store_.pendingFolders(frame.lookFrom, frame.lookEnd, kKnownAhead, isFolderType_);
    if (!found) return found.error();
    frame.lookFrom = found.value().empty() ? frame.lookEnd : found.value().back().id + 1;
    for (StoreSubfolder& folder : found.value()) {
      frame.next.push_back({folder.id, std::move(folder.name), folder.type, nullptr});
    }
    return {};
  }

  // Gives the workers what comes next: the subfolders of the deepest folder, then of those around it.
  void readAhead() {
    const Frame& deepest = frames_.back();
    if (deepest.given > 0 && workers_.waiting() > kFewWaiting) return;
    const std::size_t held = workers_.heldBytes();
    const std::size_t most =
        held < kMostHeldBytes ? kMostWaiting - std::min(kMostWaiting, workers_.waiting()) : 0;
    std::vector<std::shared_ptr<CrawlTask>> tasks;
    const std::size_t looked = held < kMostHeldBytesOfOthers ? kFoldersLookedAhead : kNextFolders;
    const std::size_t depth = std::min(looked, frames_.size());
    for (std::size_t up = 0; up < depth; ++up) {
      Frame& frame = frames_[frames_.size() - 1 - up];
      while (frame.given < frame.next.size()) {
        const bool isNext = up == 0 && frame.given == 0;
        if (tasks.size() >= most && !isNext) return workers_.give(std::move(tasks));
        tasks.push_back(makeTask(frame, frame.next[frame.given++]));
      }
    }
    workers_.give(std::move(tasks));
  }

  std::shared_ptr<CrawlFolderTask> makeTask(const Frame& frame, Child& child) {
    std::string path = path_.substr(0, frame.pathLength);
    if (!path.empty()) path += '/';
    path += child.name;
    const CrawlPlace place =
        rules_.placeInside(volume_.absolute(path), child.name, frame.place, frame.maildir.isMaildir());
    child.task = std::make_shared<CrawlFolderTask>(std::move(path), place, child.type, frame.kept);
    return child.task;
  }

  Result<void> crawlFolder(Child&& found) {
    const Child child = std::move(found);  // what it was found in may move meanwhile
    CrawlFolderTask& task = *child.task;
    if (!workers_.finish(task, cancelled_)) return systemError(ECANCELED);
    const std::int64_t first = store_.nextId();
    Frame frame{task.path.size(), task.place, std::move(task.kept), {}, {}, 0, 0, 0};
    if (task.isLarge) {
      if (auto large = crawlLargeFolder(child, frame); !large) return large;
    } else {
      writeBatch(task.batch, child.id, frame);
      auto finished = finishFolder(child, task, first, StoreFolderState::sorted);
      if (!finished) return finished;
      takeInside(task, frame);
    }
    path_ = task.path;
    if (!frame.next.empty()) frames_.push_back(std::move(frame));
    if (progress_) progress_(figures_);
    return store_.status();
  }

  // The folders that were read with the one around them are the first of those in it.
  static void takeInside(CrawlFolderTask& task, Frame& frame) {
    frame.given = std::min(task.inside.size(), frame.next.size());
    for (std::size_t index = 0; index < frame.given; ++index)
      frame.next[index].task = std::move(task.inside[index]);
    task.inside.clear();
  }

  // Its names are read as many at a time as memory is kept for, and its items by all workers at once.
  Result<void> crawlLargeFolder(const Child& child, Frame& frame) {
    const std::int64_t first = store_.nextId();
    std::shared_ptr<CrawlOpenFolder> opened;
    StoreFolderState state = StoreFolderState::sorted;
    while (true) {
      const auto names = std::make_shared<CrawlNamesTask>(*child.task, std::move(opened));
      workers_.give({names});
      if (!workers_.finish(*names, cancelled_)) return systemError(ECANCELED);
      writeAttributes(names->batch, child.id, 0);
      opened = names->opened;
      if (opened != nullptr) {
        if (auto written = writeLargeFolder(opened, child.id, frame); !written) return written;
      }
      if (names->error || names->isAtEnd) {
        return finishFolder(child, *names, first, state);
      }
      state = StoreFolderState::unsorted;
    }
  }

  Result<void> writeLargeFolder(const std::shared_ptr<CrawlOpenFolder>& opened, std::int64_t id,
                                Frame& frame) {
    std::deque<std::shared_ptr<CrawlItemsTask>> tasks;
    std::size_t given = 0;
    const std::size_t count = opened->names.size();
    while (given < count || !tasks.empty()) {
      while (given < count && tasks.size() < 2 * threads_) {
        const std::size_t end = std::min(given + CrawlItemsTask::kItems, count);
        tasks.push_back(std::make_shared<CrawlItemsTask>(opened, given, end));
        workers_.give({tasks.back()});
        given = end;
      }
      if (!workers_.finish(*tasks.front(), cancelled_)) return systemError(ECANCELED);
      writeBatch(tasks.front()->batch, id, frame);
      tasks.pop_front();
      if (auto status = store_.status(); !status) return status;
      if (progress_) progress_(figures_);
    }
    return {};
  }

  // Fails when it is this process that lacks something: then a folder is not unreadable, but the crawl is.
  Result<void> finishFolder(const Child& child, const CrawlTask& task, std::int64_t first,
                            StoreFolderState state) {
    if (task.error) {
      const int code = task.error->code;
      if (code == EMFILE || code == ENFILE || code == ENOMEM) return *task.error;
      const bool hasVanished = code == ENOENT || code == ENOTDIR || code == ELOOP;
      state = code == EXDEV ? StoreFolderState::border : StoreFolderState::unreadable;
      if (!hasVanished && code != EXDEV) figures_.problems.add(volume_.absolute(child.task->path), code);
    }
    store_.addFolder(child.id, first, store_.nextId() - first, state);
    return {};
  }

  // Writes the items of a batch, and notes the subfolders among them in the frame.
  void writeBatch(const CrawlBatch& batch, std::int64_t parent, Frame& frame) {
    const std::int64_t first = store_.nextId();
    for (const CrawledItem& item : batch.items) {
      const bool isFolder = item.kind == CrawlItemKind::folder || item.kind == CrawlItemKind::border;
      const std::string_view name = batch.nameOf(item);
      const auto size = isFolder ? std::nullopt : std::optional(item.size);
      const std::int64_t id = store_.add({parent, name, item.type, size, item.mtime});
      if (isFolder) {
        noteFolder(item, name, id, frame);
      } else {
        ++figures_.files;
        if (item.kind == CrawlItemKind::file) {
          figures_.accumulatedSizes.add(item.position, static_cast<std::uint64_t>(item.size));
        }
      }
    }
    writeAttributes(batch, parent, first);
    figures_.problems.add(batch.problems);
  }

  void noteFolder(const CrawledItem& item, std::string_view name, std::int64_t id, Frame& frame) {
    ++figures_.folders;
    frame.maildir.seeFolder(name);
    noteFolderType(item.type);
    if (item.kind == CrawlItemKind::border) {
      store_.addFolder(id, 0, 0, StoreFolderState::border);
      return;
    }
    if (frame.lookFrom == 0 && frame.next.size() < kKnownAhead) {
      frame.next.push_back({id, std::string(name), item.type, nullptr});
      return;
    }
    if (frame.lookFrom == 0) frame.lookFrom = id;
    frame.lookEnd = id + 1;
  }

  void noteFolderType(TypeId type) {
    if (type >= isFolderType_.size()) isFolderType_.resize(std::size_t{type} + 1);
    isFolderType_[type] = true;
  }

  void writeAttributes(const CrawlBatch& batch, std::int64_t folder, std::int64_t firstItem) {
    for (const CrawledAttribute& attribute : batch.attributes) {
      const bool isFolders = attribute.item == CrawledAttribute::kFolderItself;
      store_.addAttribute(isFolders ? folder : firstItem + attribute.item, attribute.name, attribute.value);
    }
  }

  void writeTypes() {
    const std::vector<bool>& used = store_.usedTypes();
    for (std::size_t type = 0; type < used.size(); ++type) {
      if (used[type])
        store_.addType(static_cast<TypeId>(type), rules_.types().type(static_cast<TypeId>(type)));
    }
  }

  const CrawlVolume& volume_;
  const CrawlRules& rules_;
  StoreWriter& store_;
  const CrawlProgress& progress_;
  const std::atomic<bool>& cancelled_;
  CrawlWorkers workers_;
  const std::size_t threads_;
  std::vector<Frame> frames_;
  std::string path_;  // of the folder that was crawled last, below the root
  std::vector<bool> isFolderType_;
  CrawlFigures figures_;
};

}  // namespace

Result<CrawlFigures> crawlVolume(const CrawlVolume& volume, const CrawlRules& rules, std::size_t threads,
                                 StoreWriter& store, const CrawlProgress& progress,
                                 const std::atomic<bool>& cancelled) {
  // On a thread of its own, whose current folder may change.
  Result<CrawlFigures> result = systemError(ECANCELED);
  std::thread writer([&] { result = Crawl(volume, rules, threads - 1, store, progress, cancelled).run(); });
  writer.join();
  return result;
}

}  // namespace norvex
