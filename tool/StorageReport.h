// Where the space of this machine went, as groups of labelled sizes: what `norvexctl show` shows, as text, as
// JSON and as a page.
//
// Made on the main thread, with the machine's roles installed; a plain value from then on.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "results/NVXScannerResults.h"

namespace norvex {

struct VolumeSpace {
  std::string root;                      // the mount point's bytes
  std::uint64_t capacity = 0, used = 0;  // bytes; both 0 when they cannot be read

  std::uint64_t free() const { return capacity - used; }
};

struct LabelledSize {
  std::string_view label;  // for people; for ever
  std::string_view key;    // in JSON; never changes
  std::uint64_t bytes = 0;
};

struct SizeGroup {
  std::string_view title;
  std::string_view key;
  std::string_view note;            // what has to be known about the figures; may be empty
  std::vector<LabelledSize> sizes;  // in a fixed order

  std::uint64_t total() const;
  // Those above 0, the largest first.
  std::vector<LabelledSize> largestFirst() const;
};

struct StorageReport {
  std::vector<VolumeSpace> volumes;
  SizeGroup categories;
  std::vector<SizeGroup> media;  // images, music, movies, by where they lie
  SizeGroup purchases;
  SizeGroup places;  // folders and kinds of files that take much room; they overlap the categories
};

// Of a finished scan over these volumes.
StorageReport storageReport(const NVXScannerResults& record, const std::vector<std::string>& volumes);

}  // namespace norvex
