#include "results/ReportTables.h"

#include <array>
#include <iterator>

namespace norvex {
namespace {

using Record = NVXScannerResults;
using namespace encoding;

// Keys and fields do not always agree by name, and the keys are what readers of the reports know: neither is
// ever derived from the other.
// clang-format off
constexpr ReportRow kSizesRows[] = {
    /*  1 */ {"com.brixo.message.total_used_volume_capacity",                 Size{&Record::totalSize}},
    /*  2 */ {"com.brixo.message.total_startup_disk_size",                    Size{&Record::startupDiskSize}},
    /*  3 */ {"com.brixo.message.music_size",                                 Size{&Record::musicSize}},
    /*  4 */ {"com.brixo.message.movies_size",                                Size{&Record::moviesSize}},
    /*  5 */ {"com.brixo.message.images_size",                                Size{&Record::imagesSize}},
    /*  6 */ {"com.brixo.message.apps_size",                                  Size{&Record::appsSize}},
    /*  7 */ {"com.brixo.message.messages_size",                              Size{&Record::messagesSize}},
    /*  8 */ {"com.brixo.message.documents_size",                             Size{&Record::documentsSize}},
    /*  9 */ {"com.brixo.message.user_downloads_size",                        Size{&Record::userDownloadsSize}},
    /* 10 */ {"com.brixo.message.user_imap_email_size",                       Size{&Record::userImapEmailSize}},
    /* 11 */ {"com.brixo.message.dovecart_apps_size",                         Size{&Record::dovecartContentSize}},
    /* 12 */ {"com.brixo.message.sonpix_store_music_size",                    Size{&Record::sonpixStoreMusicSize}},
    /* 13 */ {"com.brixo.message.sonpix_store_movies_size",                   Size{&Record::sonpixStoreMoviesSize}},
    /* 14 */ {"com.brixo.message.user_apps_size",                             Difference{&Record::appsSize, &Record::dovecartContentSize}},
    /* 15 */ {"com.brixo.message.user_music_size",                            Difference{&Record::musicSize, &Record::sonpixStoreMusicSize}},
    /* 16 */ {"com.brixo.message.user_movies_size",                           Difference{&Record::moviesSize, &Record::sonpixStoreMoviesSize}},
    /* 17 */ {"com.brixo.message.user_content_size",                          Size{&Record::userContentSize}},
    /* 18 */ {"com.brixo.message.chronel_auto_backup_enabled",                Boolean{&Record::chronelAutomaticBackupsEnabled}},
    /* 19 */ {"com.brixo.message.chronel_destinations_count",                 SignedDecimal{&Record::numberOfBackupDestinations}},
    /* 20 */ {"com.brixo.message.chronel_system_files_skipped",               Boolean{&Record::chronelSystemFilesSkipped}},
    /* 21 */ {"com.brixo.message.used_startup_disk_capacity",                 Size{&Record::usedStartupDiskSize}},
    /* 22 */ {"com.brixo.message.other_size",                                 Size{&Record::otherSize}},
    /* 23 */ {"com.brixo.message.startup_disk_music_size",                    Size{&Record::startupDiskMusicSize}},
    /* 24 */ {"com.brixo.message.startup_disk_movies_size",                   Size{&Record::startupDiskMoviesSize}},
    /* 25 */ {"com.brixo.message.startup_disk_images_size",                   Size{&Record::startupDiskImagesSize}},
    /* 26 */ {"com.brixo.message.startup_disk_apps_size",                     Size{&Record::startupDiskAppsSize}},
    /* 27 */ {"com.brixo.message.startup_disk_messages_size",                 Size{&Record::startupDiskMessagesSize}},
    /* 28 */ {"com.brixo.message.startup_disk_documents_size",                Size{&Record::startupDiskDocumentsSize}},
    /* 29 */ {"com.brixo.message.startup_disk_other_size",                    Size{&Record::startupDiskOtherSize}},
    /* 30 */ {"com.brixo.message.user_kyt_backup_size",                       Size{&Record::userKytBackupSize}},
    /* 31 */ {"com.brixo.message.images_standard_location_size",              Size{&Record::imagesInStandardLocation}},
    /* 32 */ {"com.brixo.message.music_standard_location_size",               Size{&Record::musicInStandardLocationSize}},
    /* 33 */ {"com.brixo.message.movies_standard_location_size",              Size{&Record::moviesInStandardLocationSize}},
    /* 34 */ {"com.brixo.message.movies_picara_lumvia_size",                  Size{&Record::moviesInPicaraLumviaLibrarySize}},
    /* 35 */ {"com.brixo.message.startup_disk_images_standard_location_size", Size{&Record::startupDiskImagesInStandardLocation}},
    /* 36 */ {"com.brixo.message.startup_disk_music_standard_location_size",  Size{&Record::startupDiskMusicInStandardLocationSize}},
    /* 37 */ {"com.brixo.message.startup_disk_movies_standard_location_size", Size{&Record::startupDiskMoviesInStandardLocationSize}},
    /* 38 */ {"com.brixo.message.startup_disk_movies_picara_lumvia_size",     Size{&Record::startupDiskMoviesInPicaraLumviaLibrarySize}},
    /* 39 */ {"com.brixo.message.images_in_application_bundles_size",         Size{&Record::imagesInApplicationBundles}},
    /* 40 */ {"com.brixo.message.images_in_mobile_documents_size",            Size{&Record::imagesInMobileDocumentsDirectory}},
    /* 41 */ {"com.brixo.message.images_in_library_size",                     Size{&Record::imagesInLibraryDirectory}},
    /* 42 */ {"com.brixo.message.images_in_home_directory_size",              Size{&Record::imagesInHomeDirectory}},
    /* 43 */ {"com.brixo.message.images_in_users_shared_directory_size",      Size{&Record::imagesInUsersSharedDirectory}},
    /* 44 */ {"com.brixo.message.images_in_other_locations_size",             Size{&Record::imagesInOtherLocations}},
    /* 45 */ {"com.brixo.message.music_in_application_bundles_size",          Size{&Record::musicInApplicationBundles}},
    /* 46 */ {"com.brixo.message.music_in_mobile_documents_size",             Size{&Record::musicInMobileDocumentsDirectory}},
    /* 47 */ {"com.brixo.message.music_in_library_size",                      Size{&Record::musicInLibraryDirectory}},
    /* 48 */ {"com.brixo.message.music_in_home_directory_size",               Size{&Record::musicInHomeDirectory}},
    /* 49 */ {"com.brixo.message.music_in_users_shared_directory_size",       Size{&Record::musicInUsersSharedDirectory}},
    /* 50 */ {"com.brixo.message.music_in_other_locations_size",              Size{&Record::musicInOtherLocations}},
    /* 51 */ {"com.brixo.message.movies_in_application_bundles_size",         Size{&Record::moviesInApplicationBundles}},
    /* 52 */ {"com.brixo.message.movies_in_mobile_documents_size",            Size{&Record::moviesInMobileDocumentsDirectory}},
    /* 53 */ {"com.brixo.message.movies_in_library_size",                     Size{&Record::moviesInLibraryDirectory}},
    /* 54 */ {"com.brixo.message.movies_in_home_directory_size",              Size{&Record::moviesInHomeDirectory}},
    /* 55 */ {"com.brixo.message.movies_in_users_shared_directory_size",      Size{&Record::moviesInUsersSharedDirectory}},
    /* 56 */ {"com.brixo.message.movies_in_other_locations_size",             Size{&Record::moviesInOtherLocations}},
    /* 57 */ {"com.brixo.message.kyt_apps_size",                              Size{&Record::kytAppsSize}},
    /* 58 */ {"com.brixo.message.startup_disk_kyt_apps_size",                 Size{&Record::startupDiskKytAppsSize}},
    /* 59 */ {"com.brixo.message.virtual_machines_size",                      Size{&Record::virtualMachinesSize}},
    /* 60 */ {"com.brixo.message.startup_disk_virtual_machines_size",         Size{&Record::startupDiskVirtualMachinesSize}},
    /* 61 */ {"com.brixo.message.startup_disk_dovecart_apps_size",            Size{&Record::startupDiskDovecartContentSize}},
    /* 62 */ {"com.brixo.message.startup_disk_sonpix_store_music_size",       Size{&Record::startupDiskSonpixStoreMusicSize}},
    /* 63 */ {"com.brixo.message.startup_disk_sonpix_store_movies_size",      Size{&Record::startupDiskSonpixStoreMoviesSize}},
    /* 64 */ {"com.brixo.message.startup_disk_user_content_size",             Size{&Record::startupDiskUserContentSize}},
    /* 65 */ {"com.brixo.message.chronel_sticky_exclusion_size",              Size{&Record::chronelStickyExclusionSize}},
    /* 66 */ {"com.brixo.message.startup_disk_chronel_sticky_exclusion_size", Size{&Record::startupDiskChronelStickyExclusionSize}},
};

constexpr ReportRow kCountsRows[] = {
    /*  1 */ {"com.brixo.message.startup_disk_total_filesystem_object_count", Count{&Record::startupDiskTotalFilesystemObjectCount}},
    /*  2 */ {"com.brixo.message.startup_disk_total_files_count",             Count{&Record::startupDiskTotalFilesCount}},
    /*  3 */ {"com.brixo.message.startup_disk_total_directories_count",       Count{&Record::startupDiskTotalDirectoriesCount}},
    /*  4 */ {"com.brixo.message.all_disks_total_filesystem_object_count",    Count{&Record::allDisksTotalFilesystemObjectCount}},
    /*  5 */ {"com.brixo.message.all_disks_total_files_count",                Count{&Record::allDisksTotalFilesCount}},
    /*  6 */ {"com.brixo.message.all_disks_total_directories_count",          Count{&Record::allDisksTotalDirectoriesCount}},
};

constexpr ReportRow kFolderRows[] = {
    /*  1 */ {"com.brixo.message.desktop_folder_size",                                Exact{&Record::desktopFolderSize}},
    /*  2 */ {"com.brixo.message.desktop_directory_count",                            Exact{&Record::desktopDirectoryCount}},
    /*  3 */ {"com.brixo.message.desktop_file_count",                                 Exact{&Record::desktopFileCount}},
    /*  4 */ {"com.brixo.message.desktop_filesystem_object_count",                    Exact{&Record::desktopFilesystemObjectCount}},
    /*  5 */ {"com.brixo.message.desktop_package_count",                              Exact{&Record::desktopPackageCount}},
    /*  6 */ {"com.brixo.message.desktop_package_contents_filesystem_object_count",   Exact{&Record::desktopPackageContentsFilesystemObjectCount}},
    /*  7 */ {"com.brixo.message.documents_folder_size",                              Exact{&Record::documentsFolderSize}},
    /*  8 */ {"com.brixo.message.documents_directory_count",                          Exact{&Record::documentsDirectoryCount}},
    /*  9 */ {"com.brixo.message.documents_file_count",                               Exact{&Record::documentsFileCount}},
    /* 10 */ {"com.brixo.message.documents_filesystem_object_count",                  Exact{&Record::documentsFilesystemObjectCount}},
    /* 11 */ {"com.brixo.message.documents_package_count",                            Exact{&Record::documentsPackageCount}},
    /* 12 */ {"com.brixo.message.documents_package_contents_filesystem_object_count", Exact{&Record::documentsPackageContentsFilesystemObjectCount}},
};
// clang-format on

static_assert(std::size(kSizesRows) == 66);
static_assert(std::size(kCountsRows) == 6);
static_assert(std::size(kFolderRows) == 12);

// "Notice", as of syslog.
constexpr int kReportLevel = 5;

constexpr std::array<ReportMessage, 3> kMessages = {{
    {.domain = "com.brixo.norvex.run2",
     .level = kReportLevel,
     .rows = kSizesRows,
     .onlyOnInternalInstalls = false},
    {.domain = "com.brixo.norvex.filecounts.run3",
     .level = kReportLevel,
     .rows = kCountsRows,
     .onlyOnInternalInstalls = false},
    {.domain = "com.brixo.norvex.directoryinfo.run4",
     .level = kReportLevel,
     .rows = kFolderRows,
     .onlyOnInternalInstalls = true},
}};

// The exact value behind each encoding.

template <typename SingleField>
auto exactValue(const SingleField& value, const Record& record) {
  return (record.*value.field)();
}

std::uint64_t exactValue(const Difference& value, const Record& record) {
  return (record.*value.minuend)() - (record.*value.subtrahend)();
}

// The text of an exact value in each encoding.

std::string textOf(const Size&, std::uint64_t exact) {
  return Record::bucketedStringFromSize(exact);
}

std::string textOf(const Count&, std::uint64_t exact) {
  return Record::bucketedStringFromCount(exact);
}

std::string textOf(const Difference&, std::uint64_t exact) {
  return Record::bucketedStringFromSize(exact);
}

std::string textOf(const Boolean&, bool exact) {
  return exact ? "1" : "0";
}

std::string textOf(const SignedDecimal&, std::uint64_t exact) {
  return std::to_string(static_cast<std::int64_t>(exact));
}

std::string textOf(const Exact&, std::uint64_t exact) {
  return std::to_string(exact);
}

}  // namespace

std::span<const ReportMessage> reportMessages() {
  return kMessages;
}

std::string reportedText(const ReportRow& row, const NVXScannerResults& record) {
  return std::visit([&](const auto& value) { return textOf(value, exactValue(value, record)); }, row.value);
}

ExactFigure exactFigure(const ReportRow& row, const NVXScannerResults& record) {
  return std::visit([&](const auto& value) { return ExactFigure(exactValue(value, record)); }, row.value);
}

}  // namespace norvex
