#include "scanner/NVXScanner.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <chrono>
#include <iterator>
#include <string_view>

#include "platform/Platform.h"
#include "platform/Utf8.h"
#include "scanner/DebugLevel.h"

namespace norvex {
namespace {

constexpr std::string_view sourceName = "NVXScanner";

// Where the line about a volume says that it comes from; people search their logs for it, so it stays put
// when code moves.
constexpr int scanningVolumeLine = 465;

// The text by which the startup volume is told from all others.
constexpr std::string_view startupVolumePath = "/";

// Bounds one pass of the wait for a query, not the wait.
constexpr std::chrono::seconds eventLoopPass{5};

// --- log lines

void logError(std::string_view message) {
  platform().systemLog.syslog(LogLevel::error, message);
}

void logFailure(std::string_view whatFailed, const Location& location, const Error& error) {
  std::string message(whatFailed);
  message += location.urlText();
  message += ", error: ";
  message += error.description;
  logError(message);
}

constexpr std::string_view failedTotalFileSize = "Failed to get QXURLTotalFileSize for ";
constexpr std::string_view failedIsDirectory = "Failed to get QXURLIsDirectoryKey for ";
constexpr std::string_view failedIsPackage = "Failed to get QXURLIsPackageKey for ";
constexpr std::string_view failedVolumeValues = "Failed to get resource values for ";

// A walk tells of what it cannot read and goes on past it.
bool logEnumerationError(const Location& location, const Error& error) {
  logFailure("Failed to enumerate: ", location, error);
  return true;
}

// --- the record's fields, as values that tables can name

struct FigureField {
  std::uint64_t (NVXScannerResults::*get)() const;
  void (NVXScannerResults::*set)(std::uint64_t);
};

namespace fields {
#define NVX_TEXT(name, setName)
#define NVX_SETTING(name, setName)
#define NVX_FIGURE(name, setName) \
  inline constexpr FigureField name{&NVXScannerResults::name, &NVXScannerResults::setName};
#include "results/NVXScannerResultsFields.def"
#undef NVX_TEXT
#undef NVX_SETTING
#undef NVX_FIGURE
}  // namespace fields

void add(NVXScannerResults& results, const FigureField& field, std::uint64_t amount) {
  (results.*field.set)((results.*field.get)() + amount);
}

// Where a figure of a volume goes: the field of all volumes and, while the startup volume is measured, its
// part.
struct VolumeFigure {
  const FigureField& allVolumes;
  const FigureField* startupDisk = nullptr;
};

void add(NVXScannerResults& results, const VolumeFigure& figure, bool isStartupDisk, std::uint64_t amount) {
  add(results, figure.allVolumes, amount);
  if (isStartupDisk && figure.startupDisk != nullptr) add(results, *figure.startupDisk, amount);
}

// --- where media lie

std::string inHome(std::string_view path) {
  return expandingTilde(path, platform().userFolders.home());
}

constexpr std::array<std::string_view, 4> photoLibraries = {
    "~/Pictures/Picara Library",
    "~/Pictures/Lumvia Library",
    "~/Desktop/Picara Library",
    "~/Documents/Picara Library",
};

// What the media handlers of one volume share.
struct MediaPlaces {
  std::vector<std::string> photoLibraries;
  std::string mobileDocuments;
  std::string libraryFolder;
  std::string home;
  std::string mediaFolder;
  bool volumeHoldsPhotoLibrary = false;
  bool volumeHoldsMediaFolder = false;
};

void preparePhotoLibraries(MediaPlaces& places, const std::string& volume) {
  for (const std::string_view library : photoLibraries) places.photoLibraries.push_back(inHome(library));
  places.mobileDocuments = inHome("~/Library/Mobile Documents");
  places.libraryFolder = inHome("~/Library");
  places.home = inHome("~");
  places.volumeHoldsPhotoLibrary = std::any_of(
      places.photoLibraries.begin(), places.photoLibraries.end(), [&](const std::string& library) {
        return platform().fileExistence.exists(library) && library.starts_with(volume);
      });
}

void prepareMediaFolder(MediaPlaces& places, const std::string& volume) {
  places.mediaFolder = inHome("~/Music/Sonpix");
  places.volumeHoldsMediaFolder = places.mediaFolder.starts_with(volume);
}

// All tests of paths are plain text: no normalisation, and a prefix need not end at a separator.
bool isInPhotoLibrary(const MediaPlaces& places, const std::string& path) {
  return places.volumeHoldsPhotoLibrary &&
         std::any_of(places.photoLibraries.begin(), places.photoLibraries.end(),
                     [&](const std::string& library) { return path.starts_with(library); });
}

bool isInMediaFolder(const MediaPlaces& places, const std::string& path) {
  return places.volumeHoldsMediaFolder && path.starts_with(places.mediaFolder);
}

bool isInApplicationBundle(const std::string& path) {
  return path.find(".app/") != std::string::npos;
}

// The place of an item, by the first rule that holds. The roots lie one inside the other, so the order is the
// rule.
enum class Place : std::size_t { mobileDocuments, library, home, usersShared, other };

Place placeOf(const MediaPlaces& places, const std::string& path) {
  if (path.starts_with(places.mobileDocuments)) return Place::mobileDocuments;
  if (path.starts_with(places.libraryFolder)) return Place::library;
  if (path.starts_with(places.home)) return Place::home;
  if (path.starts_with("/Users/Shared")) return Place::usersShared;
  return Place::other;
}

// --- the handlers of the seven queries

// The counters of one query over one volume. Which counter is which stands in the query's row of the table
// below; those of the media queries end with one for each Place, in the order of that enumeration.
using Counters = std::vector<std::uint64_t>;

std::uint64_t& placeCounter(Counters& counters, Place place) {
  constexpr std::size_t placeCount = static_cast<std::size_t>(Place::other) + 1;
  return counters[counters.size() - placeCount + static_cast<std::size_t>(place)];
}

// The path of a match; nullopt for the ones without, which are ignored.
std::optional<std::string> pathOf(const MetadataResult& item) {
  std::optional<MetadataValue> value = item.valueForAttribute(kMDItemPath);
  if (!value) return std::nullopt;
  auto* path = std::get_if<std::string>(&*value);
  if (path == nullptr) return std::nullopt;
  return std::move(*path);
}

bool isBought(NVXScanner& scanner, const MetadataResult& item, const Location& location) {
  return item.valueForAttribute(kMDItemPurchaseDate).has_value() ||
         scanner.isPurchasedFromSonpixStore(location);
}

void handleAnyItem(NVXScanner& scanner, const MediaPlaces&, Counters& counters, const MetadataResult& item) {
  const std::optional<std::string> path = pathOf(item);
  if (!path) return;
  counters[0] += scanner.sizeForURL(Location::file(*path));
}

namespace image {
enum : std::size_t { standardLocation, applicationBundles };
}

void handleImage(NVXScanner& scanner, const MediaPlaces& places, Counters& counters,
                 const MetadataResult& item) {
  const std::optional<std::string> path = pathOf(item);
  if (!path) return;
  const std::uint64_t size = scanner.sizeForURL(Location::file(*path));
  if (isInPhotoLibrary(places, *path)) {
    counters[image::standardLocation] += size;
    return;
  }
  // An image inside an application bundle counts here and in its place, unlike music and movies.
  if (isInApplicationBundle(*path)) counters[image::applicationBundles] += size;
  placeCounter(counters, placeOf(places, *path)) += size;
}

namespace music {
enum : std::size_t { store, standardLocation, applicationBundles };
}

void handleMusic(NVXScanner& scanner, const MediaPlaces& places, Counters& counters,
                 const MetadataResult& item) {
  const std::optional<std::string> path = pathOf(item);
  if (!path) return;
  const Location location = Location::file(*path);
  const std::uint64_t size = scanner.sizeForURL(location);
  const bool isStoreFormat = path->ends_with(".m4a") || path->ends_with(".m4p");
  if (isStoreFormat && isBought(scanner, item, location)) counters[music::store] += size;
  if (isInMediaFolder(places, *path)) counters[music::standardLocation] += size;
  if (isInApplicationBundle(*path)) {
    counters[music::applicationBundles] += size;
  } else {
    placeCounter(counters, placeOf(places, *path)) += size;
  }
}

namespace movie {
enum : std::size_t { store, standardLocation, photoLibrary, applicationBundles };
}

void handleMovie(NVXScanner& scanner, const MediaPlaces& places, Counters& counters,
                 const MetadataResult& item) {
  const std::optional<std::string> path = pathOf(item);
  if (!path) return;
  const Location location = Location::file(*path);
  std::uint64_t measured = 0;
  // 0 stands for "not measured yet", so an item of size 0 is measured again each time.
  const auto size = [&] {
    if (measured == 0) measured = scanner.sizeForURL(location);
    return measured;
  };
  const bool canBeBought = !path->ends_with(".avi") && !path->ends_with(".mkv");
  if (canBeBought && isBought(scanner, item, location)) counters[movie::store] += size();
  if (isInMediaFolder(places, *path)) counters[movie::standardLocation] += size();
  if (isInPhotoLibrary(places, *path)) {
    counters[movie::photoLibrary] += size();
    return;
  }
  if (isInApplicationBundle(*path)) {
    counters[movie::applicationBundles] += size();
  } else {
    placeCounter(counters, placeOf(places, *path)) += size();
  }
}

// --- the seven queries

constexpr VolumeFigure stickyExclusionCounters[] = {
    {fields::chronelStickyExclusionSize, &fields::startupDiskChronelStickyExclusionSize},
};

constexpr VolumeFigure receiptCounters[] = {
    {fields::dovecartContentSize, &fields::startupDiskDovecartContentSize},
};

constexpr VolumeFigure imageCounters[] = {
    {fields::imagesInStandardLocation, &fields::startupDiskImagesInStandardLocation},
    {fields::imagesInApplicationBundles},
    {fields::imagesInMobileDocumentsDirectory},
    {fields::imagesInLibraryDirectory},
    {fields::imagesInHomeDirectory},
    {fields::imagesInUsersSharedDirectory},
    {fields::imagesInOtherLocations},
};

constexpr VolumeFigure musicCounters[] = {
    {fields::sonpixStoreMusicSize, &fields::startupDiskSonpixStoreMusicSize},
    {fields::musicInStandardLocationSize, &fields::startupDiskMusicInStandardLocationSize},
    {fields::musicInApplicationBundles},
    {fields::musicInMobileDocumentsDirectory},
    {fields::musicInLibraryDirectory},
    {fields::musicInHomeDirectory},
    {fields::musicInUsersSharedDirectory},
    {fields::musicInOtherLocations},
};

constexpr VolumeFigure movieCounters[] = {
    {fields::sonpixStoreMoviesSize, &fields::startupDiskSonpixStoreMoviesSize},
    {fields::moviesInStandardLocationSize, &fields::startupDiskMoviesInStandardLocationSize},
    {fields::moviesInPicaraLumviaLibrarySize, &fields::startupDiskMoviesInPicaraLumviaLibrarySize},
    {fields::moviesInApplicationBundles},
    {fields::moviesInMobileDocumentsDirectory},
    {fields::moviesInLibraryDirectory},
    {fields::moviesInHomeDirectory},
    {fields::moviesInUsersSharedDirectory},
    {fields::moviesInOtherLocations},
};

constexpr VolumeFigure phoneApplicationCounters[] = {
    {fields::kytAppsSize, &fields::startupDiskKytAppsSize},
};

constexpr VolumeFigure virtualMachineCounters[] = {
    {fields::virtualMachinesSize, &fields::startupDiskVirtualMachinesSize},
};

struct VolumeQuery {
  std::string_view predicate;
  std::span<const VolumeFigure> counters;
  void (*handle)(NVXScanner&, const MediaPlaces&, Counters&, const MetadataResult&);
  // What has to be known of the volume from this query on.
  void (*prepare)(MediaPlaces&, const std::string& volume) = nullptr;
};

constexpr VolumeQuery volumeQueries[] = {
    {"com_brixo_backup_excludeItem == 'com.brixo.backupd'", stickyExclusionCounters, handleAnyItem},
    {"kMDItemDovecartHasReceipt=1", receiptCounters, handleAnyItem},
    {"kMDItemContentTypeTree == 'public.image'", imageCounters, handleImage, preparePhotoLibraries},
    {"kMDItemContentTypeTree == 'public.audio'", musicCounters, handleMusic, prepareMediaFolder},
    {"kMDItemContentTypeTree == 'public.movie' || kMDItemContentTypeTree == 'public.video'", movieCounters,
     handleMovie},
    {"kMDItemContentType == 'com.brixo.sonpix.ipa'", phoneApplicationCounters, handleAnyItem},
    {"kMDItemContentType == 'com.vmware.vm-package' || kMDItemContentType == 'com.parallels.vm.vmpackage' || "
     "kMDItemKind == 'Virtual Disk Image'",
     virtualMachineCounters, handleAnyItem},
};
static_assert(std::size(volumeQueries) == NVXScanner::queriesPerVolume);

// Runs the seven queries over a volume. False when one does not start.
bool runQueries(NVXScanner& scanner, NVXScannerResults& results, const Location& volume, bool isStartupDisk) {
  MediaPlaces places;
  for (const VolumeQuery& query : volumeQueries) {
    if (query.prepare != nullptr) query.prepare(places, volume.path());
    Counters counters(query.counters.size(), 0);
    const bool started = scanner.searchVolume(
        volume, std::string(query.predicate),
        [&](const MetadataResult& item) { query.handle(scanner, places, counters, item); });
    if (!started) return false;
    for (std::size_t i = 0; i < counters.size(); ++i)
      add(results, query.counters[i], isStartupDisk, counters[i]);
  }
  return true;
}

// --- the index's own totals

struct StoreTotal {
  std::size_t position;
  VolumeFigure figure;
};

constexpr StoreTotal storeTotals[] = {
    {0, {fields::messagesSize, &fields::startupDiskMessagesSize}},
    {1, {fields::otherSize, &fields::startupDiskOtherSize}},
    {2, {fields::otherSize, &fields::startupDiskOtherSize}},
    {3, {fields::otherSize, &fields::startupDiskOtherSize}},
    {4, {fields::otherSize, &fields::startupDiskOtherSize}},
    {5, {fields::otherSize, &fields::startupDiskOtherSize}},
    {6, {fields::moviesSize, &fields::startupDiskMoviesSize}},
    {7, {fields::appsSize, &fields::startupDiskAppsSize}},
    {9, {fields::musicSize, &fields::startupDiskMusicSize}},
    {10, {fields::documentsSize, &fields::startupDiskDocumentsSize}},
    {11, {fields::documentsSize, &fields::startupDiskDocumentsSize}},
    {12, {fields::imagesSize, &fields::startupDiskImagesSize}},
    {13, {fields::documentsSize, &fields::startupDiskDocumentsSize}},
    {14, {fields::documentsSize, &fields::startupDiskDocumentsSize}},
    {15, {fields::documentsSize, &fields::startupDiskDocumentsSize}},
    {17, {fields::otherSize, &fields::startupDiskOtherSize}},
};

void addStoreTotals(NVXScannerResults& results, const std::string& volume, bool isStartupDisk) {
  const std::unique_ptr<MetadataResult> item = platform().metadataIndex.itemAtPath(volume);
  if (item == nullptr) return;
  const std::optional<MetadataValue> value = item->valueForAttribute(kMDStoreAccumulatedSizes);
  if (!value) {
    // The words speak of the item, which does exist; whoever watches the log knows them so.
    logError("IdxItemCreate returned NULL for path: " + volume);
    return;
  }
  const auto* sizes = std::get_if<std::vector<std::int64_t>>(&*value);
  if (sizes == nullptr) return;
  for (const StoreTotal& total : storeTotals) {
    if (total.position >= sizes->size()) break;
    const std::int64_t size = (*sizes)[total.position];
    if (size > 0) add(results, total.figure, isStartupDisk, static_cast<std::uint64_t>(size));
  }
}

// --- the steps of the scan

// Whether every included volume that the index knows at all has been indexed to the end.
bool allStoresAreReady(std::span<const std::string> volumes) {
  return std::all_of(volumes.begin(), volumes.end(), [](const std::string& volume) {
    const std::unique_ptr<MetadataResult> item = platform().metadataIndex.itemAtPath(volume);
    return item == nullptr || item->valueForAttribute(kMDStoreLastHealthCheck).has_value();
  });
}

void readBackupSettings(NVXScannerResults& results) {
  const std::unique_ptr<BackupSettingsHandle> settings = platform().backupSettings.open();
  if (settings == nullptr) return;
  results.setChronelAutomaticBackupsEnabled(settings->automaticBackupsEnabled());
  results.setNumberOfBackupDestinations(settings->destinations().size());
  results.setChronelSystemFilesSkipped(settings->systemFilesSkipped());
}

void measureFixedFolders(NVXScanner& scanner, NVXScannerResults& results) {
  const auto folder = [](std::string_view path) { return Location::folder(normalizedPath(inHome(path))); };
  add(results, fields::userDownloadsSize, scanner.sizeForURL(folder("~/Downloads")));
  add(results, fields::userImapEmailSize,
      scanner.sizeForPaths(scanner.imapMailboxContent(Location::folder(inHome("~")))));
  add(results, fields::userKytBackupSize,
      scanner.sizeForDirectory(folder("~/Library/Application Support/Handlink/Backup/")));
}

constexpr VolumeFigure usedCapacity = {fields::totalSize, &fields::usedStartupDiskSize};

// False when the volume's index could not be asked, which ends the scan.
bool measureVolume(NVXScanner& scanner, NVXScannerResults& results, const std::string& path) {
  logDebugLine("Scanning '" + path + "'...", sourceName, scanningVolumeLine);
  const Location volume = Location::folder(path);
  const bool isStartupDisk = path == startupVolumePath;
  scanner.computeFileSystemObjectCounts(results, volume, isStartupDisk);
  add(results, usedCapacity, isStartupDisk, scanner.usedCapacityOnVolume(volume));
  if (!runQueries(scanner, results, volume, isStartupDisk)) return false;
  addStoreTotals(results, path, isStartupDisk);
  return true;
}

// Item sizes and used capacity are different measures, so either difference may wrap below zero. That is
// meant: a clamped 0 would look like a measurement.
void deriveUserContent(NVXScannerResults& results) {
  results.setUserContentSize(results.totalSize() - results.dovecartContentSize() -
                             results.sonpixStoreMusicSize() - results.sonpixStoreMoviesSize());
  results.setStartupDiskUserContentSize(
      results.usedStartupDiskSize() - results.startupDiskDovecartContentSize() -
      results.startupDiskSonpixStoreMusicSize() - results.startupDiskSonpixStoreMoviesSize());
}

// --- the detail of the Desktop and Documents folders

struct FolderDetailFields {
  std::string_view folder;
  FigureField packages;
  FigureField directories;
  FigureField files;
  FigureField objects;
  FigureField packageContents;
  FigureField bytes;
};

constexpr FolderDetailFields detailedFolders[] = {
    {"~/Desktop", fields::desktopPackageCount, fields::desktopDirectoryCount, fields::desktopFileCount,
     fields::desktopFilesystemObjectCount, fields::desktopPackageContentsFilesystemObjectCount,
     fields::desktopFolderSize},
    {"~/Documents", fields::documentsPackageCount, fields::documentsDirectoryCount,
     fields::documentsFileCount, fields::documentsFilesystemObjectCount,
     fields::documentsPackageContentsFilesystemObjectCount, fields::documentsFolderSize},
};

// Counts what one detail walk meets. Relies on the walk's order: a package's contents follow it directly.
class FolderDetail {
 public:
  FolderDetail(NVXScannerResults& results, const FolderDetailFields& detailFields)
      : results_(results), fields_(detailFields) {}

  // Makes no test for having left a package. So a package that directly follows an empty one counts as inside
  // it, and what follows an inner package counts as outside the outer one. Both are meant.
  void handlePackage(std::uint64_t depth) {
    add(results_, fields_.packages, 1);
    add(results_, fields_.directories, 1);
    countObject();
    insidePackage_ = true;
    packageDepth_ = depth;
  }

  void handleDirectory(std::uint64_t depth) {
    leavePackageAbove(depth);
    add(results_, fields_.directories, 1);
    countObject();
  }

  void handleFile(std::uint64_t depth, std::uint64_t size) {
    leavePackageAbove(depth);
    add(results_, fields_.files, 1);
    add(results_, fields_.bytes, size);
    countObject();
  }

 private:
  void countObject() {
    add(results_, fields_.objects, 1);
    if (insidePackage_) add(results_, fields_.packageContents, 1);
  }

  void leavePackageAbove(std::uint64_t depth) {
    if (packageDepth_ < depth) return;
    insidePackage_ = false;
    packageDepth_ = 0;
  }

  NVXScannerResults& results_;
  const FolderDetailFields& fields_;
  bool insidePackage_ = false;
  std::uint64_t packageDepth_ = 0;  // of the package that was entered last
};

void measureFolderDetail(NVXScanner& scanner, NVXScannerResults& results,
                         const FolderDetailFields& detailFields) {
  FolderDetail detail(results, detailFields);
  scanner.scanDirectoryInDetail(
      Location::folder(inHome(detailFields.folder)),
      [&](const Location&, std::uint64_t depth) { detail.handlePackage(depth); },
      [&](const Location&, std::uint64_t depth) { detail.handleDirectory(depth); },
      [&](const Location&, std::uint64_t depth, std::optional<std::uint64_t> size) {
        detail.handleFile(depth, size.value_or(0));
      });
}

}  // namespace

// --- the scan

std::unique_ptr<NVXScannerResults> NVXScanner::scan() {
  const std::vector<std::string> volumes = includedVolumes().value_or(std::vector<std::string>());
  if (!allStoresAreReady(volumes)) return nullptr;

  auto results = std::make_unique<NVXScannerResults>();
  readBackupSettings(*results);
  results->setHardwareModelIdentifier(hardwareModelIdentifier());
  add(*results, fields::startupDiskSize,
      totalCapacityOnVolume(Location::folder(std::string(startupVolumePath))));
  measureFixedFolders(*this, *results);
  for (const std::string& volume : volumes) {
    if (!measureVolume(*this, *results, volume)) return nullptr;
  }
  deriveUserContent(*results);
  if (platform().installation.isInternalInstall()) {
    for (const FolderDetailFields& folder : detailedFolders) measureFolderDetail(*this, *results, folder);
  }
  return results;
}

// --- metadata queries

bool NVXScanner::searchVolume(const Location& volume, const std::string& predicate,
                              const ResultHandler& handler) {
  const std::unique_ptr<MetadataQuery> query = platform().metadataIndex.createQuery();
  query->setPredicate(predicate);
  query->setValueListAttributes({std::string(kMDItemPurchaseDate)});
  query->setSearchScopes({volume});
  // Stopped before its results are read, so that none arrives meanwhile.
  const MetadataQuery::ObserverToken observer = query->addFinishObserver([&](MetadataQuery& finished) {
    finished.stop();
    for (std::size_t index = 0; index < finished.resultCount(); ++index)
      handler(*finished.resultAtIndex(index));
  });

  const bool started = query->start();
  if (started) {
    EventLoop& loop = platform().eventLoops.current();
    while (!query->isStopped()) loop.runOnce(platform().clock.now() + eventLoopPass);
  } else {
    logDebugLine("Query failed to start", sourceName, __LINE__);
  }
  query->removeFinishObserver(observer);  // waits for the hand-over when it goes on on the main thread
  return started;
}

// --- sizes

std::uint64_t NVXScanner::sizeForFile(const Location& file) {
  const auto size = platform().resourceValues.value(file, ResourceKey::TotalFileSize);
  if (!size.ok()) {
    logFailure(failedTotalFileSize, file, size.error());
    return 0;
  }
  return size.value().value_or(0);  // a folder has no total file size
}

std::uint64_t NVXScanner::sizeForDirectory(const Location& directory) {
  constexpr ResourceKey prefetch[] = {ResourceKey::TotalFileSize, ResourceKey::IsDirectory};
  const auto walk = platform().directoryEnumeration.enumerator(directory, prefetch, logEnumerationError);
  std::uint64_t sum = 0;
  while (const Location* item = walk->next()) sum += sizeForFile(*item);
  return sum;
}

std::uint64_t NVXScanner::sizeForURL(const Location& location) {
  const auto isDirectory = platform().resourceValues.value(location, ResourceKey::IsDirectory);
  if (!isDirectory.ok()) {
    logFailure(failedIsDirectory, location, isDirectory.error());
    return 0;
  }
  return isDirectory.value().value_or(0) != 0 ? sizeForDirectory(location) : sizeForFile(location);
}

std::uint64_t NVXScanner::sizeForPaths(std::span<const std::string> paths) {
  std::uint64_t total = 0;
  for (const std::string& path : paths) total += sizeForURL(Location::file(path));
  return total;
}

std::uint64_t NVXScanner::sizeForPaths(const std::set<std::string>& paths) {
  std::uint64_t total = 0;
  for (const std::string& path : paths) total += sizeForURL(Location::file(path));
  return total;
}

void NVXScanner::scanDirectoryInDetail(const Location& directory, const PackageHandler& packageHandler,
                                       const DirectoryHandler& directoryHandler,
                                       const FileHandler& fileHandler) {
  // FileSize is only a hint and is never read; the size that is read comes with it.
  constexpr ResourceKey prefetch[] = {ResourceKey::FileSize, ResourceKey::IsDirectory,
                                      ResourceKey::IsPackage};
  ResourceValues& values = platform().resourceValues;
  const auto walk = platform().directoryEnumeration.enumerator(directory, prefetch, logEnumerationError);
  while (const Location* item = walk->next()) {
    const auto isPackage = values.value(*item, ResourceKey::IsPackage);
    if (!isPackage.ok()) logFailure(failedIsPackage, *item, isPackage.error());
    const auto isDirectory = values.value(*item, ResourceKey::IsDirectory);
    if (!isDirectory.ok()) {
      logFailure(failedIsDirectory, *item, isDirectory.error());
      continue;
    }
    const std::uint64_t depth = walk->level();
    if (isPackage.ok() && isPackage.value().value_or(0) != 0) {
      if (packageHandler) packageHandler(*item, depth);
    } else if (isDirectory.value().value_or(0) != 0) {
      if (directoryHandler) directoryHandler(*item, depth);
    } else {
      const auto size = values.value(*item, ResourceKey::TotalFileSize);
      if (!size.ok()) {
        logFailure(failedTotalFileSize, *item, size.error());
      } else if (fileHandler) {
        fileHandler(*item, depth, size.value());
      }
    }
  }
}

// --- volumes

namespace {

// The wanted value, 0 when the table lacks it.
std::uint64_t valueOf(const ResourceValueTable& table, ResourceKey key) {
  const auto found = table.find(key);
  return found == table.end() ? 0 : found->second;
}

}  // namespace

std::uint64_t NVXScanner::totalCapacityOnVolume(const Location& volume) {
  constexpr ResourceKey keys[] = {ResourceKey::VolumeTotalCapacity};
  const auto values = platform().resourceValues.values(volume, keys);
  if (!values.ok()) {
    logFailure(failedVolumeValues, volume, values.error());
    return 0;
  }
  return valueOf(values.value(), ResourceKey::VolumeTotalCapacity);
}

std::uint64_t NVXScanner::usedCapacityOnVolume(const Location& volume) {
  constexpr ResourceKey keys[] = {ResourceKey::VolumeAvailableCapacity, ResourceKey::VolumeTotalCapacity};
  const auto values = platform().resourceValues.values(volume, keys);
  if (!values.ok()) {
    logFailure(failedVolumeValues, volume, values.error());
    return 0;
  }
  const std::uint64_t total = valueOf(values.value(), ResourceKey::VolumeTotalCapacity);
  const std::uint64_t available = valueOf(values.value(), ResourceKey::VolumeAvailableCapacity);
  if (total > available) return total - available;
  // Equal counts as an error too: a volume on which nothing at all is used does not exist.
  logError("Available capacity (" + std::to_string(available) + ") larger then total capacity (" +
           std::to_string(total) + ") on volume " + volume.urlText());
  return 0;
}

void NVXScanner::computeFileSystemObjectCounts(NVXScannerResults& results, const Location& volume,
                                               bool isStartupDisk) {
  VolumeCatalog& catalog = platform().volumeCatalog;
  FileReference file;
  VolumeReference volumeReference;
  VolumeObjectCounts counts;
  if (catalog.makeReference(volume.path(), file) != 0) return;
  if (catalog.volumeOf(file, volumeReference) != 0) return;
  if (catalog.objectCounts(volumeReference, counts) != 0) return;

  // Narrow on purpose: the sum has always been reported modulo 2^32.
  const std::uint32_t objects = counts.files + counts.folders;
  if (isStartupDisk) {
    add(results, fields::startupDiskTotalFilesystemObjectCount, objects);
    add(results, fields::startupDiskTotalFilesCount, counts.files);
    add(results, fields::startupDiskTotalDirectoriesCount, counts.folders);
  }
  add(results, fields::allDisksTotalFilesystemObjectCount, objects);
  add(results, fields::allDisksTotalFilesCount, counts.files);
  add(results, fields::allDisksTotalDirectoriesCount, counts.folders);
}

// --- media

bool NVXScanner::isPurchasedFromSonpixStore(const Location& file) {
  const std::vector<MediaItemKey> keys = platform().mediaMetadataReader.itemKeys(file);
  return std::any_of(keys.begin(), keys.end(), [](const MediaItemKey& key) {
    const auto* code = std::get_if<std::uint32_t>(&key);
    return code != nullptr && stringForOSType(*code) == "purd";
  });
}

std::string NVXScanner::stringForOSType(std::uint32_t code) {
  std::string text;
  bool started = false;
  for (const unsigned shift : {24U, 16U, 8U, 0U}) {
    const auto byte = static_cast<unsigned char>(code >> shift);
    if (byte == 0 && started) break;
    if (byte == 0) continue;
    started = true;
    // One character a byte. ASCII stands for itself; the upper half is taken as Latin-1.
    if (byte < 0x80) {
      text += static_cast<char>(byte);
    } else {
      text += static_cast<char>(0xC0U | (byte >> 6U));
      text += static_cast<char>(0x80U | (byte & 0x3FU));
    }
  }
  return text;
}

// --- mail

std::set<std::string> NVXScanner::imapMailboxContent(const Location& home) {
  constexpr std::string_view layoutVersions[] = {"V2", "V3"};
  const Location mailFolder = Location::folder(normalizedPath(home.appending("Library/Mail/", true).path()));
  std::set<std::string> mailboxes;
  for (const std::string_view version : layoutVersions) {
    const auto names = platform().directoryListing.names(mailFolder.appending(version, true).path());
    if (!names) continue;
    for (const std::string& name : *names) {
      // The path leaves the version folder out. That is what has always been measured; figures of two
      // releases could not be compared otherwise.
      const bool isMailbox = name.find("IMAP-") != std::string::npos;
      if (isMailbox) mailboxes.insert(mailFolder.appending(name, true).path());
    }
  }
  return mailboxes;
}

// --- system

std::shared_ptr<const std::string> NVXScanner::hardwareModelIdentifier() {
  std::array<char, 64> buffer{};
  std::size_t length = buffer.size();
  if (platform().systemControl.sysctl(kHardwareModelName, buffer.data(), &length) != 0) {
    logError("Error finding model-id, errno: " + std::to_string(errno));
    return nullptr;
  }
  const auto end = std::find(buffer.begin(), buffer.end(), '\0');
  std::string model(buffer.begin(), end);
  if (!isValidUtf8(model)) return nullptr;
  return std::make_shared<const std::string>(std::move(model));
}

std::optional<std::vector<std::string>> NVXScanner::includedVolumes() {
  const std::unique_ptr<BackupSettingsHandle> settings = platform().backupSettings.open();
  if (settings == nullptr) return std::nullopt;
  return settings->includedVolumes();
}

}  // namespace norvex
