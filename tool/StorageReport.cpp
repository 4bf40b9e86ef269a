#include "tool/StorageReport.h"

#include <algorithm>
#include <array>
#include <numeric>
#include <span>

#include "platform/Platform.h"
#include "results/RecordField.h"

namespace norvex {
namespace {

using Record = NVXScannerResults;

struct Row {
  const char* label;
  const char* key;
  FigureGetter field;
};

// clang-format off
constexpr Row kCategories[] = {
    {"Music",             "music",     &Record::musicSize},
    {"Movies",            "movies",    &Record::moviesSize},
    {"Images",            "images",    &Record::imagesSize},
    {"Applications",      "apps",      &Record::appsSize},
    {"Mail and messages", "messages",  &Record::messagesSize},
    {"Documents",         "documents", &Record::documentsSize},
    {"Other",             "other",     &Record::otherSize},
};

// The images in application bundles are counted in their other places too, so they have no row here.
constexpr Row kImages[] = {
    {"Photo libraries",        "photoLibraries",  &Record::imagesInStandardLocation},
    {"Mobile documents",       "mobileDocuments", &Record::imagesInMobileDocumentsDirectory},
    {"Library folder",         "library",         &Record::imagesInLibraryDirectory},
    {"Elsewhere in your home", "home",            &Record::imagesInHomeDirectory},
    {"Shared users folder",    "usersShared",     &Record::imagesInUsersSharedDirectory},
    {"Anywhere else",          "elsewhere",       &Record::imagesInOtherLocations},
};
constexpr Row kMusic[] = {
    {"Application bundles",    "applicationBundles", &Record::musicInApplicationBundles},
    {"Mobile documents",       "mobileDocuments",    &Record::musicInMobileDocumentsDirectory},
    {"Library folder",         "library",            &Record::musicInLibraryDirectory},
    {"Elsewhere in your home", "home",               &Record::musicInHomeDirectory},
    {"Shared users folder",    "usersShared",        &Record::musicInUsersSharedDirectory},
    {"Anywhere else",          "elsewhere",          &Record::musicInOtherLocations},
};
constexpr Row kMovies[] = {
    {"Photo libraries",        "photoLibraries",     &Record::moviesInPicaraLumviaLibrarySize},
    {"Application bundles",    "applicationBundles", &Record::moviesInApplicationBundles},
    {"Mobile documents",       "mobileDocuments",    &Record::moviesInMobileDocumentsDirectory},
    {"Library folder",         "library",            &Record::moviesInLibraryDirectory},
    {"Elsewhere in your home", "home",               &Record::moviesInHomeDirectory},
    {"Shared users folder",    "usersShared",        &Record::moviesInUsersSharedDirectory},
    {"Anywhere else",          "elsewhere",          &Record::moviesInOtherLocations},
};

constexpr Row kPurchases[] = {
    {"Applications", "apps",   &Record::dovecartContentSize},
    {"Music",        "music",  &Record::sonpixStoreMusicSize},
    {"Movies",       "movies", &Record::sonpixStoreMoviesSize},
};

constexpr Row kPlaces[] = {
    {"Downloads",             "downloads",         &Record::userDownloadsSize},
    {"Mail of remote accounts", "remoteMail",      &Record::userImapEmailSize},
    {"Phone backups",         "phoneBackups",      &Record::userKytBackupSize},
    {"Phone applications",    "phoneApps",         &Record::kytAppsSize},
    {"Virtual machines",      "virtualMachines",   &Record::virtualMachinesSize},
    {"Left out of backups",   "leftOutOfBackups",  &Record::chronelStickyExclusionSize},
};
// clang-format on

std::vector<LabelledSize> sizesOf(std::span<const Row> rows, const Record& record) {
  std::vector<LabelledSize> sizes;
  for (const Row& row : rows) sizes.push_back({row.label, row.key, (record.*row.field)()});
  return sizes;
}

VolumeSpace spaceOf(const std::string& root) {
  constexpr std::array kKeys{ResourceKey::VolumeTotalCapacity, ResourceKey::VolumeAvailableCapacity};
  const auto values = platform().resourceValues.values(Location::folder(root), kKeys);
  if (!values) return {root};  // the scan has told of it
  const auto valueOf = [&values](ResourceKey key) {
    const auto found = values.value().find(key);
    return found == values.value().end() ? 0 : found->second;
  };
  const std::uint64_t capacity = valueOf(ResourceKey::VolumeTotalCapacity);
  return {root, capacity, capacity - std::min(capacity, valueOf(ResourceKey::VolumeAvailableCapacity))};
}

}  // namespace

std::uint64_t SizeGroup::total() const {
  return std::accumulate(sizes.begin(), sizes.end(), std::uint64_t{0},
                         [](std::uint64_t sum, const LabelledSize& size) { return sum + size.bytes; });
}

std::vector<LabelledSize> SizeGroup::largestFirst() const {
  std::vector<LabelledSize> some;
  std::copy_if(sizes.begin(), sizes.end(), std::back_inserter(some),
               [](const LabelledSize& size) { return size.bytes > 0; });
  std::stable_sort(some.begin(), some.end(),
                   [](const LabelledSize& a, const LabelledSize& b) { return a.bytes > b.bytes; });
  return some;
}

StorageReport storageReport(const NVXScannerResults& record, const std::vector<std::string>& volumes) {
  StorageReport report;
  for (const std::string& volume : volumes) report.volumes.push_back(spaceOf(volume));
  report.categories = {"What it is", "categories",
                       "By the length of the files, which need not agree with the space that they take.",
                       sizesOf(kCategories, record)};
  report.media = {{"Images, by where they lie", "images", "", sizesOf(kImages, record)},
                  {"Music, by where it lies", "music", "", sizesOf(kMusic, record)},
                  {"Movies, by where they lie", "movies", "", sizesOf(kMovies, record)}};
  report.purchases = {"Bought in the stores", "purchases", "", sizesOf(kPurchases, record)};
  report.places = {"Also worth a look", "places", "Counted above as well, each as what it is.",
                   sizesOf(kPlaces, record)};
  return report;
}

}  // namespace norvex
