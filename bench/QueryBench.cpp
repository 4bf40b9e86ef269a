// Asks the index what the scan asks it: norvex_query_bench CACHE_FOLDER TREE [PREDICATE]
//
// Opens the store of TREE, as the scan does when it looks whether the volume is ready, and runs the seven
// predicates of the scan over it, or one that is given, on the loop of this thread. Reads the path and the
// size of every match. Prints for each how many there were, the seconds that it took, the sum of their sizes,
// and the longest that one turn of the loop kept other inputs waiting.
#include <algorithm>
#include <array>
#include <chrono>
#include <cstdio>

#include "index/StoredMetadataIndex.h"
#include "platform/linux/SteadyClock.h"
#include "platform/linux/ThreadEventLoops.h"

namespace {

using namespace norvex;

constexpr std::array kPredicates{
    "com_brixo_backup_excludeItem == 'com.brixo.backupd'",
    "kMDItemDovecartHasReceipt=1",
    "kMDItemContentTypeTree == 'public.image'",
    "kMDItemContentTypeTree == 'public.audio'",
    "kMDItemContentTypeTree == 'public.movie' || kMDItemContentTypeTree == 'public.video'",
    "kMDItemContentType == 'com.brixo.sonpix.ipa'",
    "kMDItemContentType == 'com.vmware.vm-package' || kMDItemContentType == 'com.parallels.vm.vmpackage' || "
    "kMDItemKind == 'Virtual Disk Image'",
};

double now() {
  return std::chrono::duration<double>(std::chrono::steady_clock::now().time_since_epoch()).count();
}

struct Matches {
  std::size_t count = 0;
  std::size_t pathBytes = 0;
  std::int64_t bytes = 0;
};

Matches readAll(const MetadataQuery& query) {
  Matches matches;
  matches.count = query.resultCount();
  for (std::size_t index = 0; index < matches.count; ++index) {
    const auto item = query.resultAtIndex(index);
    const auto path = item->valueForAttribute(kMDItemPath);
    const auto size = item->valueForAttribute("kMDItemFSSize");
    if (path) matches.pathBytes += std::get<std::string>(*path).size();
    if (size) matches.bytes += std::get<std::int64_t>(*size);
  }
  return matches;
}

// False when the query does not start.
bool ask(StoredMetadataIndex& index, EventLoops& loops, const char* tree, const char* predicate) {
  const double start = now();
  const auto query = index.createQuery();
  query->setPredicate(predicate);
  query->setSearchScopes({Location::folder(tree)});
  Matches matches;
  double gathered = 0, longest = 0;
  const auto token = query->addFinishObserver([&](MetadataQuery& finished) {
    gathered = now();
    finished.stop();
    matches = readAll(finished);
  });
  if (!query->start()) return false;
  while (!query->isStopped()) {
    const double turn = now();
    loops.current().runOnce(Clock::Moment::max());
    longest = std::max(longest, (gathered > 0 ? gathered : now()) - turn);
  }
  query->removeFinishObserver(token);
  std::printf("%7zu matches in %.4f s, %lld bytes, longest turn %.4f s: %s\n", matches.count, now() - start,
              static_cast<long long>(matches.bytes), longest, predicate);
  return true;
}

}  // namespace

int main(int count, char** arguments) {
  if (count < 3) {
    std::fprintf(stderr, "usage: norvex_query_bench CACHE_FOLDER TREE [PREDICATE]\n");
    return 2;
  }
  ThreadEventLoops loops;
  VolumeStores stores{StoreFolder(arguments[1])};
  StoredMetadataIndex index(stores, loops);
  const double start = now();
  if (index.itemAtPath(arguments[2]) == nullptr) {
    std::fprintf(stderr, "norvex_query_bench: no store of %s that can be read\n", arguments[2]);
    return 1;
  }
  std::printf("opened in %.4f s\n", now() - start);
  if (count > 3) return ask(index, loops, arguments[2], arguments[3]) ? 0 : 1;
  bool isAnswered = true;
  for (const char* predicate : kPredicates) isAnswered &= ask(index, loops, arguments[2], predicate);
  return isAnswered ? 0 : 1;
}
