// What the crawl has to know about items besides what the file system says: their types, the attributes that
// it derives, and where their bytes are accumulated.
//
// Asked by several threads at once; const. Paths are absolute, names are the file system's bytes.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "index/StoreWriter.h"

namespace norvex {

// What items inherit from the folder that they are in.
struct CrawlPlace {
  bool inApplication = false;  // inside an application bundle or deployment, at any depth
  bool holdsMessages = false;  // the `cur` or `new` of a mail folder
};

// What a rule says about one item besides its type.
struct CrawlMark {
  std::string_view name;
  std::string_view value;
};

class CrawlRules {
 public:
  virtual ~CrawlRules() = default;

  // Type numbers are small and count from 0.
  virtual std::uint32_t fileType(std::string_view name) const = 0;
  virtual std::uint32_t folderType(std::string_view name, bool isMarkedPackage) const = 0;
  virtual std::uint32_t symbolicLinkType() const = 0;
  virtual std::uint32_t otherType() const = 0;
  virtual StoreType describe(std::uint32_t type) const = 0;

  // The position, below kAccumulatedSizeCount, that a regular file's size counts in.
  virtual std::size_t sizePosition(std::uint32_t type, std::string_view name, bool isExecutable,
                                   const CrawlPlace& place) const = 0;

  // What a folder passes on to its items. `inMailFolder`: it is in a folder that has `cur`, `new` and `tmp`.
  virtual CrawlPlace placeInside(std::string_view path, std::string_view name, const CrawlPlace& around,
                                 bool inMailFolder) const = 0;

  // Whether the folder is one in which a receipt is looked for.
  virtual bool mayHoldReceipt(std::string_view name, std::uint32_t type) const = 0;

  // Whether an item has a receipt because of where it is: an application's deployment, an application
  // archive.
  virtual bool hasReceiptByPlace(std::string_view folderPath, std::string_view name, bool isFolder) const = 0;
};

}  // namespace norvex
