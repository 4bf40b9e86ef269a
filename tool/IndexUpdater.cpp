#include "tool/IndexUpdater.h"

#include <cerrno>
#include <utility>

#include "index/ContentTypes.h"
#include "index/StoreReader.h"
#include "tool/FigureText.h"
#include "tool/SafeText.h"
#include "tool/UpdateProgress.h"

namespace norvex {
namespace {

constexpr std::size_t kMostProblemsShown = 5;

// How many items the volume's present index holds, for an estimate; 0 when there is none to be read.
std::uint64_t itemsOfPresentIndex(const StoreFolder& stores, const std::string& volume) {
  const auto store = StoreReader::open(stores, volume, StoreReader::Check::factsOnly);
  const StoreCounts counts = store ? store.value()->counts().value_or(StoreCounts()) : StoreCounts();
  return counts.files + counts.folders;
}

}  // namespace

IndexUpdater::IndexUpdater(ToolWorld& world, Faults& faults)
    : world_(world),
      faults_(faults),
      rules_(ContentTypes::load(ContentTypes::defaultMimeFolders(world.dataHome)), world.dataHome) {}

std::optional<TimedSummary> IndexUpdater::update(const std::string& volume) {
  if (world_.cancelled) {
    tellStopped(volume);
    return std::nullopt;
  }
  if (!world_.isMountPoint(volume)) {
    faults_.add(volume, "notThere",
                "not indexed: no volume is mounted there; mount it, or take it out of IncludedVolumes "
                "in chronel/backup.conf");
    return std::nullopt;
  }
  const Clock::Moment started = world_.clock.now();
  auto updated = updateWhenFree(volume);
  if (!updated) {
    tellFailure(volume, updated.error());
    return std::nullopt;
  }
  tellProblems(volume, updated.value().figures.problems);
  return TimedSummary{std::move(updated).value(), world_.clock.now() - started};
}

Result<IndexUpdateSummary> IndexUpdater::updateWhenFree(const std::string& volume) {
  auto updated = updateOnce(volume, false);
  if (updated || updated.error().code != EBUSY) return updated;
  world_.err.tell(safeText(volume) + ": another update of this volume is under way; waiting for its end");
  return updateOnce(volume, true);
}

Result<IndexUpdateSummary> IndexUpdater::updateOnce(const std::string& volume, bool wait) {
  UpdateProgress progress(world_, volume, itemsOfPresentIndex(world_.stores, volume));
  const auto show = [&progress](const CrawlFigures& figures) { progress.show(figures); };
  return updateIndex(world_.stores, volume, rules_, {wait, show}, world_.cancelled);
}

void IndexUpdater::tellStopped(const std::string& volume) {
  faults_.add(volume, "stopped", "not indexed: stopped; the index that it has is as it was");
}

void IndexUpdater::tellFailure(const std::string& volume, const Error& error) {
  if (error.code == ECANCELED) return tellStopped(volume);
  const std::string folder = safeText(world_.stores.path());
  std::string message = "not indexed: " + error.description;
  if (error.code == ENOSPC || error.code == EDQUOT)
    message += "; make room where indexes are kept: " + folder;
  if (error.code == EACCES || error.code == EPERM || error.code == EROFS)
    message += "; both the volume and the folder of indexes must be open to you: " + folder;
  faults_.add(volume, "failed", message);
}

void IndexUpdater::tellProblems(const std::string& volume, const CrawlProblems& problems) {
  if (problems.count == 0) return;
  world_.err.tell(safeText(volume) + ": could not be read and " + (problems.count == 1 ? "is" : "are") +
                  " not in the index: " + countText(world_.digits, problems.count, "item"));
  std::uint64_t shown = 0;
  for (const CrawlProblem& problem : problems.first) {
    if (shown == kMostProblemsShown) break;
    ++shown;
    world_.err.stream() << "  " << safeText(problem.path) << ": " << systemError(problem.code).description
                        << '\n';
  }
  if (shown < problems.count)
    world_.err.stream() << "  and " << world_.digits(problems.count - shown) << " more\n";
  world_.err.stream() << std::flush;
}

}  // namespace norvex
