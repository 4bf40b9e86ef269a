// What the tests of the three media handlers share: one match, one scan, the figures that grew.
#pragma once

#include <string>

#include "scanner/NVXScanner.h"
#include "tests/scanner/ScanWorld.h"

namespace norvex {

// One match of one media query on the startup volume.
struct MediaMatch {
  std::string path;
  std::uint64_t size = 7;
  bool hasPurchaseDate = false;
  bool holdsPurchaseItem = false;  // the file itself carries the store's mark
};

// A world whose startup volume holds `match`; with a photo library at "~/Pictures/Picara Library" or without.
class MediaWorld : public ScanWorld {
 public:
  enum class PhotoLibrary { none, exists };

  MediaWorld(Query query, const MediaMatch& match, PhotoLibrary library) {
    if (library == PhotoLibrary::exists) files.put("/Users/user/Pictures", folder("Picara Library"));
    holds("/", query, match.path, match.size, match.hasPurchaseDate);
    if (match.holdsPurchaseItem) mediaMetadataReader.keysOfFile[match.path] = {std::uint32_t{0x70757264}};
  }

  std::string scanned(std::initializer_list<std::string_view> parts) const {
    return figures(NVXScanner().scan(), parts);
  }
};

}  // namespace norvex
