#include "results/SummaryTable.h"

#include <algorithm>
#include <iterator>

#include "platform/Platform.h"

namespace norvex {
namespace {

using Record = NVXScannerResults;
using namespace form;

// The mixed case of the labels, and the order, which is not the record's, are what readers of the log lines
// know.
// clang-format off
constexpr SummaryRow kRows[] = {
    /*  1 */ {"Hardware Model Identifier",                                   AsItIs{&Record::hardwareModelIdentifier}},
    /*  2 */ {"Total used size",                                             ByteCount{&Record::totalSize}},
    /*  3 */ {"Startup Disk capacity",                                       ByteCount{&Record::startupDiskSize}},
    /*  4 */ {"Startup Disk usedSize",                                       ByteCount{&Record::usedStartupDiskSize}},
    /*  5 */ {"",                                                            EmptyLine{}},
    /*  6 */ {"Dovecart content size",                                       ByteCount{&Record::dovecartContentSize}},
    /*  7 */ {"Sonpix Store music size",                                     ByteCount{&Record::sonpixStoreMusicSize}},
    /*  8 */ {"Sonpix Store movies size",                                    ByteCount{&Record::sonpixStoreMoviesSize}},
    /*  9 */ {"",                                                            EmptyLine{}},
    /* 10 */ {"Music Size",                                                  ByteCount{&Record::musicSize}},
    /* 11 */ {"Movies Size",                                                 ByteCount{&Record::moviesSize}},
    /* 12 */ {"Images Size",                                                 ByteCount{&Record::imagesSize}},
    /* 13 */ {"Apps Size",                                                   ByteCount{&Record::appsSize}},
    /* 14 */ {"Messages Size",                                               ByteCount{&Record::messagesSize}},
    /* 15 */ {"Documents Size",                                              ByteCount{&Record::documentsSize}},
    /* 16 */ {"Other Size",                                                  ByteCount{&Record::otherSize}},
    /* 17 */ {"",                                                            EmptyLine{}},
    /* 18 */ {"Startup Disk Dovecart content size",                          ByteCount{&Record::startupDiskDovecartContentSize}},
    /* 19 */ {"Startup Disk Sonpix Store music size",                        ByteCount{&Record::startupDiskSonpixStoreMusicSize}},
    /* 20 */ {"Startup Disk Sonpix Store movies size",                       ByteCount{&Record::startupDiskSonpixStoreMoviesSize}},
    /* 21 */ {"",                                                            EmptyLine{}},
    /* 22 */ {"Startup Disk Music Size",                                     ByteCount{&Record::startupDiskMusicSize}},
    /* 23 */ {"Startup Disk Movies Size",                                    ByteCount{&Record::startupDiskMoviesSize}},
    /* 24 */ {"Startup Disk Images Size",                                    ByteCount{&Record::startupDiskImagesSize}},
    /* 25 */ {"Startup Disk Apps Size",                                      ByteCount{&Record::startupDiskAppsSize}},
    /* 26 */ {"Startup Disk Messages Size",                                  ByteCount{&Record::startupDiskMessagesSize}},
    /* 27 */ {"Startup Disk Documents Size",                                 ByteCount{&Record::startupDiskDocumentsSize}},
    /* 28 */ {"Startup Disk Other Size",                                     ByteCount{&Record::startupDiskOtherSize}},
    /* 29 */ {"",                                                            EmptyLine{}},
    /* 30 */ {"~/Downloads Size",                                            ByteCount{&Record::userDownloadsSize}},
    /* 31 */ {"~/Library/Mail/V2/*IMAP-* and ~/Library/Mail/V3/*IMAP-* Size", ByteCount{&Record::userImapEmailSize}},
    /* 32 */ {"~/Library/Application Support/Handlink/Backup/ Size",         ByteCount{&Record::userKytBackupSize}},
    /* 33 */ {"Kyt Apps Size",                                               ByteCount{&Record::kytAppsSize}},
    /* 34 */ {"Startup Disk Kyt Apps Size",                                  ByteCount{&Record::startupDiskKytAppsSize}},
    /* 35 */ {"Virtual Machines Size",                                       ByteCount{&Record::virtualMachinesSize}},
    /* 36 */ {"Startup Disk Virtual Machines Size",                          ByteCount{&Record::startupDiskVirtualMachinesSize}},
    /* 37 */ {"",                                                            EmptyLine{}},
    /* 38 */ {"Images in Standard Location Size",                            ByteCount{&Record::imagesInStandardLocation}},
    /* 39 */ {"Music in Standard Location Size",                             ByteCount{&Record::musicInStandardLocationSize}},
    /* 40 */ {"Movies in Standard Location Size",                            ByteCount{&Record::moviesInStandardLocationSize}},
    /* 41 */ {"Movies in Picara Lumvia Library Size",                        ByteCount{&Record::moviesInPicaraLumviaLibrarySize}},
    /* 42 */ {"",                                                            EmptyLine{}},
    /* 43 */ {"Startup Disk Images in Standard Location Size",               ByteCount{&Record::startupDiskImagesInStandardLocation}},
    /* 44 */ {"Startup Disk Music in Standard Location Size",                ByteCount{&Record::startupDiskMusicInStandardLocationSize}},
    /* 45 */ {"Startup Disk Movies in Standard Location Size",               ByteCount{&Record::startupDiskMoviesInStandardLocationSize}},
    /* 46 */ {"Startup Disk Movies in Picara Lumvia Library Size",           ByteCount{&Record::startupDiskMoviesInPicaraLumviaLibrarySize}},
    /* 47 */ {"",                                                            EmptyLine{}},
    /* 48 */ {"Images in Application Bundles Size",                          ByteCount{&Record::imagesInApplicationBundles}},
    /* 49 */ {"Images in Mobile Documents Directory Size",                   ByteCount{&Record::imagesInMobileDocumentsDirectory}},
    /* 50 */ {"Images in Library Directory Size",                            ByteCount{&Record::imagesInLibraryDirectory}},
    /* 51 */ {"Images in Home Directory Size",                               ByteCount{&Record::imagesInHomeDirectory}},
    /* 52 */ {"Images in /Users/Shared Directory Size",                      ByteCount{&Record::imagesInUsersSharedDirectory}},
    /* 53 */ {"Images in Other Locations Size",                              ByteCount{&Record::imagesInOtherLocations}},
    /* 54 */ {"Music in Application Bundles Size",                           ByteCount{&Record::musicInApplicationBundles}},
    /* 55 */ {"Music in Mobile Documents Directory Size",                    ByteCount{&Record::musicInMobileDocumentsDirectory}},
    /* 56 */ {"Music in Library Directory Size",                             ByteCount{&Record::musicInLibraryDirectory}},
    /* 57 */ {"Music in Home Directory Size",                                ByteCount{&Record::musicInHomeDirectory}},
    /* 58 */ {"Music in /Users/Shared Directory Size",                       ByteCount{&Record::musicInUsersSharedDirectory}},
    /* 59 */ {"Music in Other Locations Size",                               ByteCount{&Record::musicInOtherLocations}},
    /* 60 */ {"Movies in Application Bundles Size",                          ByteCount{&Record::moviesInApplicationBundles}},
    /* 61 */ {"Movies in Mobile Documents Directory Size",                   ByteCount{&Record::moviesInMobileDocumentsDirectory}},
    /* 62 */ {"Movies in Library Directory Size",                            ByteCount{&Record::moviesInLibraryDirectory}},
    /* 63 */ {"Movies in Home Directory Size",                               ByteCount{&Record::moviesInHomeDirectory}},
    /* 64 */ {"Movies in /Users/Shared Directory Size",                      ByteCount{&Record::moviesInUsersSharedDirectory}},
    /* 65 */ {"Movies in Other Locations Size",                              ByteCount{&Record::moviesInOtherLocations}},
    /* 66 */ {"",                                                            EmptyLine{}},
    /* 67 */ {"Chronel Sticky Exclusion Size",                               ByteCount{&Record::chronelStickyExclusionSize}},
    /* 68 */ {"Startup Disk Chronel Sticky Exclusion Size",                  ByteCount{&Record::startupDiskChronelStickyExclusionSize}},
    /* 69 */ {"",                                                            EmptyLine{}},
    /* 70 */ {"Chronel Automatic Backups",                                   OnOff{&Record::chronelAutomaticBackupsEnabled}},
    /* 71 */ {"Number of Chronel Backup Destinations",                       SignedDigits{&Record::numberOfBackupDestinations}},
    /* 72 */ {"Chronel System Files Skipped",                                OnOff{&Record::chronelSystemFilesSkipped}},
    /* 73 */ {"",                                                            EmptyLine{}},
    /* 74 */ {"Startup Disk Total Filesystem Object Count",                  Digits{&Record::startupDiskTotalFilesystemObjectCount}},
    /* 75 */ {"Startup Disk Total Files Count",                              Digits{&Record::startupDiskTotalFilesCount}},
    /* 76 */ {"Startup Disk Total Directories Count",                        Digits{&Record::startupDiskTotalDirectoriesCount}},
    /* 77 */ {"All Disks Total Filesystem Object Count",                     Digits{&Record::allDisksTotalFilesystemObjectCount}},
    /* 78 */ {"All Disks Total Files Count",                                 Digits{&Record::allDisksTotalFilesCount}},
    /* 79 */ {"All Disks Total Folders Count",                               Digits{&Record::allDisksTotalDirectoriesCount}},
    /* 80 */ {"",                                                            EmptyLine{}},
    /* 81 */ {"Desktop Folder Size",                                         ByteCount{&Record::desktopFolderSize}},
    /* 82 */ {"Desktop Folder Directory Count",                              Digits{&Record::desktopDirectoryCount}},
    /* 83 */ {"Desktop Folder File Count",                                   Digits{&Record::desktopFileCount}},
    /* 84 */ {"Desktop Folder Total Filesystem Object Count",                Digits{&Record::desktopFilesystemObjectCount}},
    /* 85 */ {"Desktop Folder Package Count",                                Digits{&Record::desktopPackageCount}},
    /* 86 */ {"Desktop Folder Package Total Filesystem Object Count",        Digits{&Record::desktopPackageContentsFilesystemObjectCount}},
    /* 87 */ {"Documents Folder Size",                                       ByteCount{&Record::documentsFolderSize}},
    /* 88 */ {"Documents Folder Directory Count",                            Digits{&Record::documentsDirectoryCount}},
    /* 89 */ {"Documents Folder File Count",                                 Digits{&Record::documentsFileCount}},
    /* 90 */ {"Documents Folder Total Filesystem Object Count",              Digits{&Record::documentsFilesystemObjectCount}},
    /* 91 */ {"Documents Folder Package Count",                              Digits{&Record::documentsPackageCount}},
    /* 92 */ {"Documents Folder Package Total Filesystem Object Count",      Digits{&Record::documentsPackageContentsFilesystemObjectCount}},
};
// clang-format on

constexpr bool showsValue(const SummaryRow& row) {
  return !std::holds_alternative<EmptyLine>(row.value);
}

static_assert(std::size(kRows) == 92);
static_assert(std::ranges::count_if(kRows, showsValue) == 80);

std::string textOf(const EmptyLine&, const Record&) {
  return {};
}

std::string textOf(const ByteCount& value, const Record& record) {
  return platform().byteCountFormatter.string((record.*value.field)());
}

std::string textOf(const Digits& value, const Record& record) {
  return std::to_string((record.*value.field)());
}

std::string textOf(const SignedDigits& value, const Record& record) {
  return std::to_string(static_cast<std::int64_t>((record.*value.field)()));
}

std::string textOf(const OnOff& value, const Record& record) {
  return (record.*value.field)() ? "On" : "Off";
}

std::string textOf(const AsItIs& value, const Record& record) {
  const auto& text = (record.*value.field)();
  return text ? *text : "(null)";
}

}  // namespace

std::span<const SummaryRow> summaryRows() {
  return kRows;
}

std::string summaryLine(const SummaryRow& row, const NVXScannerResults& record) {
  if (!showsValue(row)) return "\n";
  std::string line(row.label);
  line += ": ";
  line += std::visit([&](const auto& value) { return textOf(value, record); }, row.value);
  line += '\n';
  return line;
}

}  // namespace norvex
