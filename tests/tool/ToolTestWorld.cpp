#include "ToolTestWorld.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <time.h>

#include <cstdlib>
#include <fstream>
#include <iterator>
#include <stdexcept>

#include "index/ContentTypes.h"
#include "index/Crawl.h"
#include "index/CrawlVolume.h"
#include "index/StoreWriter.h"

namespace norvex {
namespace {

using namespace ondisk;

const std::vector<Item>& items() {
  static const std::vector<Item> tree{
      file("a.png", 4000), file("b.txt", 1000),
      folder("sub", {file("plain", 7).withAttribute("user.kMDItemRating", "5"), file("two\nlines", 0)})};
  return tree;
}

template <typename Value>
Value must(Result<Value> result) {
  if (!result) throw std::runtime_error(result.error().description);
  return std::move(result).value();
}

void must(const Result<void>& result) {
  if (!result) throw std::runtime_error(result.error().description);
}

void replaceAll(std::string& text, const std::string& from, const std::string& to) {
  for (std::size_t at = 0; (at = text.find(from, at)) != std::string::npos; at += to.size())
    text.replace(at, from.size(), to);
}

void setTime(const std::string& path) {
  const timespec moment{ToolTestWorld::kIndexed - 1000, 0};
  const timespec times[] = {moment, moment};
  ::utimensat(AT_FDCWD, path.c_str(), times, AT_SYMLINK_NOFOLLOW);
}

}  // namespace

ToolTestWorld::ToolTestWorld(const ConsoleStyle& style)
    : tree(items()),
      out(outText, style),
      err(errText, style),
      world{out,
            err,
            stores,
            settings,
            byteCounts,
            [](std::uint64_t number) { return std::to_string(number); },
            clock,
            [] { return kIndexed + 120; },
            [this](const std::string& path) { return path == volume(); },
            [](const std::string& path) { return path; },
            cache.path("data"),
            cache.path("diagnostics.jsonl"),
            cache.path("disabled"),
            journal,
            job,
            [] { return false; },
            cancelled} {
  ::setenv("TZ", "UTC0", 1);
  ::tzset();
  for (const char* name : {"a.png", "b.txt", "sub/plain", "sub/two\nlines", "sub", "."})
    setTime(tree.path(name));
}

void ToolTestWorld::index() const {
  must(stores.prepare());
  // Only what is built in: the machine's own database must not change what the tests see.
  const CrawlRules rules(ContentTypes::load({}), cache.path("data"));
  const CrawlVolume crawled = must(CrawlVolume::open(volume(), cache.path()));
  StoreWriter writer = must(StoreWriter::create(stores.unfinishedPath(volume()), cancelled));
  const CrawlFigures figures = must(crawlVolume(crawled, rules, 1, writer, {}, cancelled));
  must(writer.finish({volume(), must(fileSystemIdAt(volume())), figures.files, figures.folders,
                      figures.problems.count, figures.accumulatedSizes.values()},
                     kIndexed));
  must(stores.publish(volume()));
}

void ToolTestWorld::include(std::vector<std::string> volumes) {
  settings.content.emplace();
  settings.content->includedVolumes = std::move(volumes);
}

void ToolTestWorld::damage() const {
  must(stores.prepare());
  std::ofstream(stores.storePath(volume()), std::ios::binary) << std::string(5000, 'x');
}

std::string ToolTestWorld::storeBytes() const {
  std::ifstream file(stores.storePath(volume()), std::ios::binary);
  return {std::istreambuf_iterator<char>(file), {}};
}

std::string ToolTestWorld::withoutPaths(std::string text) const {
  replaceAll(text, stores.storePath(volume()), "<store>");
  replaceAll(text, volume(), "<volume>");
  replaceAll(text, cache.path(), "<cache>");
  return text;
}

}  // namespace norvex
