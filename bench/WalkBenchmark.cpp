// Times the walks inside one process: norvex_walk_benchmark, with the folder to walk in NORVEX_BENCH_TREE.
#include <benchmark/benchmark.h>

#include <cstdlib>

#include "MeasuredScanner.h"

namespace {

using norvex::Location;
using norvex::bench::MeasuredScanner;

void sizeForDirectory(benchmark::State& state, const Location& folder) {
  MeasuredScanner scanner;
  for (auto round : state) benchmark::DoNotOptimize(scanner.sizeOf(folder));
}

void scanDirectoryInDetail(benchmark::State& state, const Location& folder) {
  MeasuredScanner scanner;
  std::int64_t items = 0;
  for (auto round : state) {
    const MeasuredScanner::Detail detail = scanner.detailOf(folder);
    items += static_cast<std::int64_t>(detail.packages + detail.folders + detail.files);
  }
  state.SetItemsProcessed(items);
}

}  // namespace

int main(int argc, char** argv) {
  const char* tree = std::getenv("NORVEX_BENCH_TREE");
  const Location folder = Location::folder(tree != nullptr ? tree : ".");
  for (const auto& [name, operation] : {std::pair("sizeForDirectory", &sizeForDirectory),
                                        std::pair("scanDirectoryInDetail", &scanDirectoryInDetail)}) {
    benchmark::RegisterBenchmark(name, operation, folder)
        ->Unit(benchmark::kMillisecond)
        ->MeasureProcessCPUTime()
        ->UseRealTime();
  }
  benchmark::Initialize(&argc, argv);
  if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 2;
  benchmark::RunSpecifiedBenchmarks();
  return 0;
}
