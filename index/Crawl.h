// The crawl of a whole volume into a new store, depth first and in byte order of names, so that the same tree
// always makes the same store.
//
// Workers read folders ahead; this thread takes them in order and writes. What waits to be crawled is looked
// up in the store itself, so that memory does not grow with the volume.
#pragma once

#include <atomic>
#include <cstdint>
#include <functional>
#include <string>

#include "index/AccumulatedSizes.h"
#include "index/CrawlBatch.h"
#include "index/CrawlRules.h"
#include "index/CrawlVolume.h"
#include "index/StoreWriter.h"
#include "platform/Result.h"

namespace norvex {

// What a crawl has come to so far.
struct CrawlFigures {
  std::uint64_t files = 0;    // everything that is no folder, under each of its names
  std::uint64_t folders = 0;  // without the volume's root
  AccumulatedSizes accumulatedSizes;
  CrawlProblems problems;
};

// Called after every piece of work - often - on a thread of the crawl's, while its caller waits.
using CrawlProgress = std::function<void(const CrawlFigures&)>;

// Writes every item of `volume`, with `threads` (1 or more) that read. The error is the store's, or
// ECANCELED; what a file system does not let be read is no failure but a problem among the figures.
Result<CrawlFigures> crawlVolume(const CrawlVolume& volume, const CrawlRules& rules, std::size_t threads,
                                 StoreWriter& store, const CrawlProgress& progress,
                                 const std::atomic<bool>& cancelled);

}  // namespace norvex
