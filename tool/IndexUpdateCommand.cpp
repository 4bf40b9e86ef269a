#include "tool/IndexUpdateCommand.h"

#include <cerrno>
#include <utility>

#include "index/ContentTypes.h"
#include "index/CrawlRules.h"
#include "index/IndexUpdate.h"
#include "tool/Faults.h"
#include "tool/FigureText.h"
#include "tool/JsonText.h"
#include "tool/SafeText.h"
#include "tool/UpdateProgress.h"
#include "tool/Volumes.h"

namespace norvex {
namespace {

constexpr std::size_t kMostProblemsShown = 5;

struct TimedSummary {
  IndexUpdateSummary update;
  std::chrono::duration<double> elapsed{};

  std::uint64_t items() const { return update.figures.files + update.figures.folders; }
};

class IndexUpdateCommand {
 public:
  IndexUpdateCommand(ToolWorld& world, const IndexUpdateRequest& request)
      : world_(world),
        request_(request),
        rules_(ContentTypes::load(ContentTypes::defaultMimeFolders(world.dataHome)), world.dataHome),
        faults_(world.err) {}

  ExitStatus run() {
    const auto volumes = chosenVolumes(world_, request_.volumes);
    if (!volumes || volumes->empty()) {
      world_.err.tell(
          "the backup settings name no volume to index, so nothing was done; name the volumes, for example: "
          "norvexctl index update /");
    }
    for (const std::string& volume : volumes.value_or(std::vector<std::string>())) update(volume);
    if (request_.json) writeJson();
    return faults_.status();
  }

 private:
  void update(const std::string& volume) {
    if (world_.cancelled) return tellStopped(volume);
    if (!world_.isMountPoint(volume)) {
      return faults_.add(
          volume, "notThere",
          "not indexed: no volume is mounted there; mount it, or take it out of IncludedVolumes "
          "in chronel/backup.conf");
    }
    const Clock::Moment started = world_.clock.now();
    auto updated = updateWhenFree(volume);
    if (!updated) return tellFailure(volume, updated.error());
    tell(volume, {std::move(updated).value(), world_.clock.now() - started});
  }

  Result<IndexUpdateSummary> updateWhenFree(const std::string& volume) {
    auto updated = updateOnce(volume, false);
    if (updated || updated.error().code != EBUSY) return updated;
    world_.err.tell(safeText(volume) + ": another update of this volume is under way; waiting for its end");
    return updateOnce(volume, true);
  }

  Result<IndexUpdateSummary> updateOnce(const std::string& volume, bool wait) {
    UpdateProgress progress(world_.err, world_.clock, world_.byteCounts, volume);
    const auto show = [&progress](const CrawlFigures& figures) { progress.show(figures); };
    return updateIndex(world_.stores, volume, rules_, {wait, show}, world_.cancelled);
  }

  void tellStopped(const std::string& volume) {
    faults_.add(volume, "stopped", "not indexed: stopped; the index that it has is as it was");
  }

  void tellFailure(const std::string& volume, const Error& error) {
    if (error.code == ECANCELED) return tellStopped(volume);
    const std::string folder = safeText(world_.stores.path());
    std::string message = "not indexed: " + error.description;
    if (error.code == ENOSPC || error.code == EDQUOT)
      message += "; make room where indexes are kept: " + folder;
    if (error.code == EACCES || error.code == EPERM || error.code == EROFS)
      message += "; both the volume and the folder of indexes must be open to you: " + folder;
    faults_.add(volume, "failed", message);
  }

  void tell(const std::string& volume, const TimedSummary& summary) {
    tellProblems(volume, summary.update.figures.problems);
    if (request_.json) return keepForJson(volume, summary);
    const CrawlFigures& figures = summary.update.figures;
    world_.out.stream() << safeText(volume) << ": " << countText(summary.items(), "item") << " ("
                        << countText(figures.files, "file") << ", " << countText(figures.folders, "folder")
                        << ") in " << secondsText(summary.elapsed) << " s ("
                        << perSecond(summary.items(), summary.elapsed) << " items/s), "
                        << figures.problems.count << " unreadable, index "
                        << world_.byteCounts.string(summary.update.storeBytes) << std::endl;
  }

  void tellProblems(const std::string& volume, const CrawlProblems& problems) {
    if (problems.count == 0) return;
    world_.err.tell(safeText(volume) + ": could not be read and " + (problems.count == 1 ? "is" : "are") +
                    " not in the index: " + countText(problems.count, "item"));
    std::uint64_t shown = 0;
    for (const CrawlProblem& problem : problems.first) {
      if (shown == kMostProblemsShown) break;
      ++shown;
      world_.err.stream() << "  " << safeText(problem.path) << ": " << systemError(problem.code).description
                          << '\n';
    }
    if (shown < problems.count) world_.err.stream() << "  and " << problems.count - shown << " more\n";
    world_.err.stream() << std::flush;
  }

  void keepForJson(const std::string& volume, const TimedSummary& summary) {
    const CrawlFigures& figures = summary.update.figures;
    JsonDocument entry, problems = JsonDocument::array();
    setText(entry, "root", volume);
    entry["items"] = summary.items();
    entry["files"] = figures.files;
    entry["folders"] = figures.folders;
    entry["seconds"] = summary.elapsed.count();
    entry["itemsPerSecond"] = perSecond(summary.items(), summary.elapsed);
    entry["unreadable"] = figures.problems.count;
    for (const CrawlProblem& problem : figures.problems.first) {
      JsonDocument item;
      setText(item, "path", problem.path);
      item["errno"] = problem.code;
      item["message"] = systemError(problem.code).description;
      problems.push_back(std::move(item));
    }
    entry["firstUnreadable"] = std::move(problems);
    entry["storeBytes"] = summary.update.storeBytes;
    updated_.push_back(std::move(entry));
  }

  void writeJson() {
    JsonDocument document;
    document["version"] = kJsonVersion;
    document["volumes"] = updated_;
    document["errors"] = faults_.asJson();
    world_.out.stream() << jsonPage(document);
  }

  ToolWorld& world_;
  const IndexUpdateRequest& request_;
  const CrawlRules rules_;
  Faults faults_;
  JsonDocument updated_ = JsonDocument::array();
};

}  // namespace

ExitStatus runIndexUpdate(ToolWorld& world, const IndexUpdateRequest& request) {
  return IndexUpdateCommand(world, request).run();
}

}  // namespace norvex
