#include "index/IndexUpdate.h"

#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <string>
#include <thread>
#include <utility>

#include "index/StoreReader.h"
#include "index/StoreWriter.h"

namespace norvex {
namespace {

std::int64_t secondsSince1970() {
  using std::chrono::duration_cast, std::chrono::seconds, std::chrono::system_clock;
  return duration_cast<seconds>(system_clock::now().time_since_epoch()).count();
}

// Removes the unfinished store when its scope is left without having published it.
class UnfinishedStore {
 public:
  explicit UnfinishedStore(std::string path) : path_(std::move(path)) {}
  ~UnfinishedStore() { ::unlink(path_.c_str()); }
  UnfinishedStore(const UnfinishedStore&) = delete;
  UnfinishedStore& operator=(const UnfinishedStore&) = delete;

 private:
  std::string path_;
};

class IndexUpdate {
 public:
  IndexUpdate(const StoreFolder& folder, std::string root, const CrawlRules& rules,
              const IndexUpdateOptions& options, const std::atomic<bool>& cancelled)
      : folder_(folder), root_(std::move(root)), rules_(rules), options_(options), cancelled_(cancelled) {}

  Result<IndexUpdateSummary> run() {
    const auto volume = CrawlVolume::open(root_, folder_.cacheFolder());
    if (!volume) return volume.error();
    const auto fileSystem = fileSystemIdAt(root_);
    if (!fileSystem) return fileSystem.error();
    if (const auto prepared = folder_.prepare(); !prepared) return prepared.error();
    const auto lock = StoreLock::take(folder_.lockPath(root_), options_.waitForOtherUpdate, cancelled_);
    if (!lock) return lock.error();

    const UnfinishedStore unfinished(folder_.unfinishedPath(root_));
    facts_.root = root_;
    facts_.fileSystem = fileSystem.value();
    if (!StoreReader::open(folder_, root_, StoreReader::Check::factsOnly)) {
      if (const auto published = publishEmpty(); !published) return published.error();
    }
    return publishCrawled(volume.value());
  }

 private:
  Result<void> publishEmpty() {
    auto store = StoreWriter::create(folder_.unfinishedPath(root_), cancelled_);
    if (!store) return store.error();
    const TypeId type = rules_.types().ofFolder(root_.substr(root_.rfind('/') + 1), false);
    store.value().add({0, {}, type, std::nullopt, 0});
    store.value().addType(type, rules_.types().type(type));
    if (auto finished = store.value().finishEmpty(facts_); !finished) return finished;
    return folder_.publish(root_);
  }

  Result<IndexUpdateSummary> publishCrawled(const CrawlVolume& volume) {
    auto store = StoreWriter::create(folder_.unfinishedPath(root_), cancelled_);
    if (!store) return store.error();
    const std::size_t threads = std::max(1U, std::thread::hardware_concurrency());
    auto figures = crawlVolume(volume, rules_, threads, store.value(), options_.progress, cancelled_);
    if (!figures) return figures.error();
    facts_.files = figures.value().files;
    facts_.folders = figures.value().folders;
    facts_.unreadable = figures.value().problems.count;
    facts_.accumulatedSizes = figures.value().accumulatedSizes.values();
    if (const auto finished = store.value().finish(facts_, secondsSince1970()); !finished)
      return finished.error();
    if (cancelled_.load(std::memory_order_relaxed)) return systemError(ECANCELED);
    if (const auto published = folder_.publish(root_); !published) return published.error();
    IndexUpdateSummary summary{std::move(figures).value(), 0};
    struct stat status {};
    if (::stat(folder_.storePath(root_).c_str(), &status) == 0) {
      summary.storeBytes = static_cast<std::uint64_t>(status.st_size);
    }
    return summary;
  }

  const StoreFolder& folder_;
  const std::string root_;
  const CrawlRules& rules_;
  const IndexUpdateOptions& options_;
  const std::atomic<bool>& cancelled_;
  StoreVolumeFacts facts_;
};

}  // namespace

Result<IndexUpdateSummary> updateIndex(const StoreFolder& folder, std::string_view volumeRoot,
                                       const CrawlRules& rules, const IndexUpdateOptions& options,
                                       const std::atomic<bool>& cancelled) {
  return IndexUpdate(folder, normalizedVolumeRoot(volumeRoot), rules, options, cancelled).run();
}

}  // namespace norvex
