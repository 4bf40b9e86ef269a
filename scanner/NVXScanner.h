// NVXScanner: measures how the user's storage is used.
//
// One is made for a run, on the thread of the run; it keeps nothing between calls. A measurement that fails
// is logged where it fails and yields the neutral result named here; it never ends the scan. Sizes are bytes,
// all figures are unsigned 64-bit and sums wrap.
#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <set>
#include <span>
#include <string>
#include <vector>

#include "platform/Location.h"
#include "platform/MetadataIndex.h"
#include "results/NVXScannerResults.h"

namespace norvex {

// Takes one match of a query. Called on the main thread, one match at a time, while searchVolume waits.
using ResultHandler = std::function<void(const MetadataResult&)>;

// Take one item of a detail walk: where it is, its depth (1 for the walked folder's direct children) and, for
// a file, its total size in bytes, which may be absent. Each may be empty. Called on the thread of the scan,
// in the walk's order.
using PackageHandler = std::function<void(const Location&, std::uint64_t depth)>;
using DirectoryHandler = std::function<void(const Location&, std::uint64_t depth)>;
using FileHandler =
    std::function<void(const Location&, std::uint64_t depth, std::optional<std::uint64_t> size)>;

class NVXScanner {
 public:
  // --- the scan

  // Measures everything and returns the record, which the caller owns. Nothing when a volume's index has no
  // health check yet, or when a query does not start; nothing has been reported then.
  std::unique_ptr<NVXScannerResults> scan();

  // How many queries a scan makes of each volume; a measure of how far it has come.
  static constexpr std::size_t queriesPerVolume = 7;

  // --- metadata queries

  // Hands every match of `predicate` on `volume` to `handler`, in the index's order, and returns true once
  // the last one has been handled. False when the query does not start; the handler has not been called then.
  bool searchVolume(const Location& volume, const std::string& predicate, const ResultHandler& handler);

  // --- sizes

  // The file's total size; 0 for a folder, and, with a line in the log, for what cannot be read.
  std::uint64_t sizeForFile(const Location& file);

  // The sum over everything below the folder, package contents included. What cannot be read is logged and
  // adds 0.
  std::uint64_t sizeForDirectory(const Location& directory);

  // Either of the two, by what lies there. 0, with a line in the log, when that cannot be told.
  std::uint64_t sizeForURL(const Location& location);

  // The sum over the paths, in the collection's own order; a path that a list holds twice counts twice.
  std::uint64_t sizeForPaths(std::span<const std::string> paths);
  std::uint64_t sizeForPaths(const std::set<std::string>& paths);

  // Hands everything below the folder to the handler of its kind. Items that cannot be read are logged and
  // passed over.
  void scanDirectoryInDetail(const Location& directory, const PackageHandler& packageHandler,
                             const DirectoryHandler& directoryHandler, const FileHandler& fileHandler);

  // --- volumes

  // Bytes that the volume holds; 0, with a line in the log, when that cannot be read.
  std::uint64_t totalCapacityOnVolume(const Location& volume);

  // Bytes of it that are in use; 0, with a line in the log, when that cannot be read and when nothing is in
  // use.
  std::uint64_t usedCapacityOnVolume(const Location& volume);

  // Adds the volume's own counts of files and folders to the record. Leaves it as it was when there are none.
  void computeFileSystemObjectCounts(NVXScannerResults& results, const Location& volume, bool isStartupDisk);

  // --- media, mail, system

  // Whether the media file carries a purchase date of the media store. False for what is no media file.
  bool isPurchasedFromSonpixStore(const Location& file);

  // The characters of a four-character code, without leading zero bytes, up to the first zero byte. UTF-8.
  static std::string stringForOSType(std::uint32_t code);

  // The paths of the remote accounts' mail folders below a home folder. Empty when there are none.
  std::set<std::string> imapMailboxContent(const Location& home);

  // The machine's model; nothing, with a line in the log, when the system does not tell, and when it is no
  // UTF-8.
  static std::shared_ptr<const std::string> hardwareModelIdentifier();

  // The mount points that the backup feature includes; nothing when it is not set up.
  std::optional<std::vector<std::string>> includedVolumes();
};

}  // namespace norvex
