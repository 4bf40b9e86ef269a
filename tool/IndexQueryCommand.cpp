#include "tool/IndexQueryCommand.h"

#include <algorithm>
#include <utility>

#include "index/PredicateParser.h"
#include "index/PredicateSql.h"
#include "index/StoreSearch.h"
#include "tool/Faults.h"
#include "tool/JsonText.h"
#include "tool/PredicateErrorText.h"
#include "tool/SafeText.h"
#include "tool/Volumes.h"

namespace norvex {
namespace {

// Where the matches go, in one of the forms that were asked for. Written as they are found: there may be
// millions.
class MatchWriter {
 public:
  MatchWriter(Console& out, const IndexQueryRequest& request) : out_(out), request_(request) {
    if (!request_.json) return;
    out_.stream() << "{\"version\":" << kJsonVersion;
    if (!request_.countOnly) out_.stream() << ",\"items\":[";
  }

  void add(const std::string& path) {
    ++count_;
    if (request_.json) {
      JsonDocument item;
      setText(item, "path", path);
      out_.stream() << (count_ == 1 ? "\n" : ",\n") << jsonLine(item);
    } else if (request_.nullSeparated) {
      out_.stream() << path << '\0';
    } else {
      out_.stream() << (out_.style().isTerminal ? safeText(path) : path) << '\n';
    }
  }

  void addCount(std::uint64_t count) { count_ += count; }

  void finish(const Faults& faults) {
    if (request_.json) {
      out_.stream() << (request_.countOnly ? "" : "\n]") << ",\"count\":" << count_
                    << ",\"errors\":" << jsonLine(faults.asJson()) << "}\n";
    } else if (request_.countOnly) {
      out_.stream() << count_ << '\n';
    }
  }

 private:
  Console& out_;
  const IndexQueryRequest& request_;
  std::uint64_t count_ = 0;
};

Result<void> writeMatches(StoreReader& store, const PredicateSql& sql, bool countOnly, MatchWriter& writer) {
  auto search = StoreSearch::begin(store, sql);
  if (!search) return search.error();
  std::vector<std::int64_t> items;
  while (!search.value().isDone()) {
    items.clear();
    if (const auto found = search.value().findMore(items); !found) return found.error();
    if (countOnly) {
      writer.addCount(items.size());
      continue;
    }
    for (const std::int64_t item : items) {
      const auto path = store.pathOf(item);
      if (!path) return path.error();
      writer.add(path.value());
    }
  }
  return {};
}

// Of the included volumes those that have an index: who asks for nothing particular wants what is there.
std::vector<std::string> queriedVolumes(const ToolWorld& world, const IndexQueryRequest& request) {
  std::vector<std::string> volumes =
      chosenVolumes(world, request.volumes).value_or(std::vector<std::string>{"/"});
  if (!request.volumes.empty()) return volumes;
  std::vector<std::string> indexed;
  std::copy_if(volumes.begin(), volumes.end(), std::back_inserter(indexed),
               [&world](const std::string& volume) { return hasStoreFile(world.stores, volume); });
  return indexed.empty() ? volumes : indexed;  // what has no index is told of each
}

ExitStatus tellPredicateError(ToolWorld& world, const std::string& predicate, const PredicateError& error) {
  world.err.tell("the predicate makes no sense: " + error.message);
  world.err.stream() << predicateErrorExcerpt(predicate, error, world.err.style().width) << std::flush;
  return ExitStatus::usage;
}

}  // namespace

ExitStatus runIndexQuery(ToolWorld& world, const IndexQueryRequest& request) {
  const auto parsed = parsePredicate(request.predicate);
  if (const auto* error = std::get_if<PredicateError>(&parsed)) {
    return tellPredicateError(world, request.predicate, *error);
  }
  const PredicateSql sql = compilePredicate(std::get<Predicate>(parsed));
  Faults faults(world.err);
  MatchWriter writer(world.out, request);
  for (const std::string& volume : queriedVolumes(world, request)) {
    const auto store = openStore(world.stores, volume);
    if (const auto* fault = std::get_if<StoreFault>(&store)) {
      faults.add(volume, *fault);
      continue;
    }
    const auto written = writeMatches(*std::get<0>(store), sql, request.countOnly, writer);
    if (!written) faults.add(volume, "failed", "the query ended early: " + written.error().description);
  }
  writer.finish(faults);
  return faults.status();
}

}  // namespace norvex
