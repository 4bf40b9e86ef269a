#include "QueriedVolume.h"

namespace norvex {
namespace {

std::string pathOf(const MetadataResult& item) {
  const auto value = item.valueForAttribute(kMDItemPath);
  return value ? std::get<std::string>(*value) : "(no path)";
}

}  // namespace

void turnUntilStopped(TestPlatform& world, MetadataQuery& query) {
  for (int pass = 0; pass < 1000 && !query.isStopped(); ++pass)
    world.eventLoops.loop.runOnce(world.clock.now());
}

std::vector<std::string> QueriedVolume::search(const std::string& predicate) {
  const auto query = makeStoredQuery(stores, world.eventLoops);
  query->setPredicate(predicate);
  query->setSearchScopes({Location::folder(volume.root())});
  std::vector<std::string> found;
  const auto token = query->addFinishObserver([&](MetadataQuery& finished) {
    finished.stop();
    for (std::size_t i = 0; i < finished.resultCount(); ++i) {
      const std::string path = pathOf(*finished.resultAtIndex(i));
      found.push_back(path.starts_with(volume.root()) ? path.substr(volume.root().size()) : path);
    }
  });
  if (!query->start()) {
    query->removeFinishObserver(token);
    return {"did not start"};
  }
  turnUntilStopped(world, *query);
  query->removeFinishObserver(token);
  return found;
}

}  // namespace norvex
