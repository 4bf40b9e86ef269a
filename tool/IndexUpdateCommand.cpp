#include "tool/IndexUpdateCommand.h"

#include "tool/Faults.h"
#include "tool/FigureText.h"
#include "tool/IndexUpdater.h"
#include "tool/JsonText.h"
#include "tool/ProgressLine.h"
#include "tool/SafeText.h"
#include "tool/StopSignals.h"
#include "tool/Volumes.h"

namespace norvex {
namespace {

void writeText(ToolWorld& world, const std::string& volume, const TimedSummary& summary) {
  const CrawlFigures& figures = summary.update.figures;
  world.out.stream() << safeText(volume) << ": " << countText(world.digits, summary.items(), "item") << " ("
                     << countText(world.digits, figures.files, "file") << ", "
                     << countText(world.digits, figures.folders, "folder") << ") in "
                     << secondsText(summary.elapsed) << " s ("
                     << world.digits(perSecond(summary.items(), summary.elapsed)) << " items/s), "
                     << world.digits(figures.problems.count) << " unreadable, index "
                     << world.byteCounts.string(summary.update.storeBytes) << std::endl;
}

JsonDocument problemsAsJson(const CrawlProblems& problems) {
  JsonDocument list = JsonDocument::array();
  for (const CrawlProblem& problem : problems.first) {
    JsonDocument item;
    setText(item, "path", problem.path);
    item["errno"] = problem.code;
    item["message"] = systemError(problem.code).description;
    list.push_back(std::move(item));
  }
  return list;
}

JsonDocument jsonOf(const std::string& volume, const TimedSummary& summary) {
  const CrawlFigures& figures = summary.update.figures;
  JsonDocument entry;
  setText(entry, "root", volume);
  entry["items"] = summary.items();
  entry["files"] = figures.files;
  entry["folders"] = figures.folders;
  entry["seconds"] = summary.elapsed.count();
  entry["itemsPerSecond"] = perSecond(summary.items(), summary.elapsed);
  entry["unreadable"] = figures.problems.count;
  entry["firstUnreadable"] = problemsAsJson(figures.problems);
  entry["storeBytes"] = summary.update.storeBytes;
  return entry;
}

}  // namespace

ExitStatus runIndexUpdate(ToolWorld& world, const IndexUpdateRequest& request) {
  Faults faults(world.err);
  const StopSignals stoppable;
  IndexUpdater updater(world, faults);
  const auto volumes = chosenVolumes(world, request.volumes);
  if (!volumes || volumes->empty()) {
    world.err.tell(
        "the backup settings name no volume to index, so nothing was done; name the volumes, for example: "
        "norvexctl index update /");
  }
  JsonDocument entries = JsonDocument::array();
  for (const std::string& volume : volumes.value_or(std::vector<std::string>())) {
    const auto summary = updater.update(volume);
    if (!summary) continue;
    if (request.json) {
      entries.push_back(jsonOf(volume, *summary));
    } else {
      writeText(world, volume, *summary);
    }
  }
  if (request.json) {
    world.out.stream() << jsonPage(
        {{"version", kJsonVersion}, {"volumes", std::move(entries)}, {"errors", faults.asJson()}});
  }
  return faults.status();
}

}  // namespace norvex
