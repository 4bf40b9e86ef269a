#include "index/CrawlRules.h"

#include <utility>

#include "index/FolderRules.h"
#include "index/StorageClasses.h"

namespace norvex {

CrawlRules::CrawlRules(ContentTypes types, std::string_view dataHome)
    : types_(std::move(types)),
      flatpakInstallations_(norvex::flatpakInstallations(dataHome)),
      plainFolder_(types_.ofFolder("", false)) {}

StoragePosition CrawlRules::sizePosition(TypeId type, bool isExecutable, const CrawlPlace& place) const {
  const ItemContext context{place.inApplication, place.holdsMessages, isExecutable};
  return positionOf(types_.type(type), context);
}

CrawlPlace CrawlRules::placeInside(std::string_view path, std::string_view name, const CrawlPlace& around,
                                   bool inMaildir) const {
  const bool inApplication = around.inApplication || isApplicationBundleName(name) || folderHasReceipt(path);
  return {inApplication, inMaildir && isMaildirMessageFolder(name)};
}

bool CrawlRules::fileHasReceipt(std::string_view folderPath, std::string_view name) const {
  return isInstalledSnap(folderPath, name);
}

bool CrawlRules::folderHasReceipt(std::string_view path) const {
  return isFlatpakDeployment(path, flatpakInstallations_);
}

}  // namespace norvex
