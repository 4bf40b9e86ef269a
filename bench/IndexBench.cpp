// Indexes one tree and says what that took: norvex_index_bench CACHE_FOLDER TREE [update|query]
//
// `update` (the default) makes the store; `query` asks a store that is there: opening it, a type that nothing
// has, and the paths of all images and music. Times in seconds. Ctrl-C leaves the old store.
#include <sys/resource.h>

#include <array>
#include <atomic>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <string_view>

#include "index/IndexUpdate.h"
#include "index/StoreReader.h"

namespace {

using norvex::StoreReader;

std::atomic<bool> cancelled{false};

double now() {
  return std::chrono::duration<double>(std::chrono::steady_clock::now().time_since_epoch()).count();
}

int fail(const norvex::Error& error) {
  std::fprintf(stderr, "norvex_index_bench: %s\n", error.description.c_str());
  return 1;
}

int update(const norvex::StoreFolder& folder, const char* root) {
  const char* home = std::getenv("HOME");
  const std::string dataHome = std::string(home == nullptr ? "" : home) + "/.local/share";
  const norvex::CrawlRules rules(
      norvex::ContentTypes::load(norvex::ContentTypes::defaultMimeFolders(dataHome)), dataHome);
  const double start = now();
  double crawled = start;
  norvex::IndexUpdateOptions options;
  options.progress = [&crawled](const norvex::CrawlFigures&) { crawled = now(); };
  const auto summary = norvex::updateIndex(folder, root, rules, options, cancelled);
  if (!summary) return fail(summary.error());
  const double end = now();
  const norvex::CrawlFigures& figures = summary.value().figures;
  const auto items = static_cast<double>(figures.files + figures.folders);
  struct rusage usage {};
  ::getrusage(RUSAGE_SELF, &usage);
  std::printf("%.3f s, of which %.3f s after the crawl; user %.2f s, system %.2f s, peak memory %.1f MiB\n",
              end - start, end - crawled,
              static_cast<double>(usage.ru_utime.tv_sec) + 1e-6 * static_cast<double>(usage.ru_utime.tv_usec),
              static_cast<double>(usage.ru_stime.tv_sec) + 1e-6 * static_cast<double>(usage.ru_stime.tv_usec),
              static_cast<double>(usage.ru_maxrss) / 1024);
  std::printf("%llu files, %llu folders, %llu unreadable; %.1f bytes an item\n",
              static_cast<unsigned long long>(figures.files),
              static_cast<unsigned long long>(figures.folders),
              static_cast<unsigned long long>(figures.problems.count),
              static_cast<double>(summary.value().storeBytes) / items);
  for (const norvex::CrawlProblem& problem : figures.problems.first) {
    std::printf("  %s: %s\n", problem.path.c_str(), std::strerror(problem.code));
  }
  return 0;
}

// Prints how many rows the statement gives and how long that took.
int time(StoreReader& reader, const char* what, std::string_view sql) {
  const double start = now();
  auto statement = reader.prepare(sql);
  if (!statement) return fail(statement.error());
  int rows = 0, status = SQLITE_ROW;
  while ((status = sqlite3_step(statement.value().get())) == SQLITE_ROW) ++rows;
  if (status != SQLITE_DONE) return fail(reader.lastError());
  std::printf("%s: %d rows in %.4f s\n", what, rows, now() - start);
  return 0;
}

int query(const norvex::StoreFolder& folder, const char* root) {
  const double start = now();
  const auto reader = StoreReader::open(folder, root);
  if (!reader) return fail(reader.error());
  std::printf("open: %.4f s\n", now() - start);
  constexpr std::array<std::array<const char*, 2>, 4> kQueries{{
      {"no such type", "SELECT id FROM items WHERE type IN (SELECT id FROM types WHERE identifier='none')"},
      {"no such ancestor",
       "SELECT id FROM items WHERE type IN (SELECT type FROM type_tree WHERE ancestor='none')"},
      {"images",
       "SELECT path_of(id) FROM items WHERE type IN (SELECT type FROM type_tree WHERE "
       "ancestor='public.image')"},
      {"music",
       "SELECT path_of(id) FROM items WHERE type IN (SELECT type FROM type_tree WHERE "
       "ancestor='public.audio')"},
  }};
  int status = 0;
  for (const auto& [what, sql] : kQueries) status |= time(*reader.value(), what, sql);
  return status;
}

}  // namespace

int main(int count, char** arguments) {
  if (count < 3) {
    std::fprintf(stderr, "usage: norvex_index_bench CACHE_FOLDER TREE [update|query]\n");
    return 2;
  }
  std::signal(SIGINT, [](int) { cancelled = true; });
  const norvex::StoreFolder folder(arguments[1]);
  const bool isQuery = count > 3 && std::string_view(arguments[3]) == "query";
  return isQuery ? query(folder, arguments[2]) : update(folder, arguments[2]);
}
