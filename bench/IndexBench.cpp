// Indexes one tree and says what that took: norvex_index_bench CACHE_FOLDER TREE
//
// Times in seconds. Ctrl-C leaves the old store.
#include <sys/resource.h>

#include <atomic>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>

#include "index/IndexUpdate.h"

namespace {

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

}  // namespace

int main(int count, char** arguments) {
  if (count != 3) {
    std::fprintf(stderr, "usage: norvex_index_bench CACHE_FOLDER TREE\n");
    return 2;
  }
  std::signal(SIGINT, [](int) { cancelled = true; });
  return update(norvex::StoreFolder(arguments[1]), arguments[2]);
}
