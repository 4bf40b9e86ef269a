// What the crawl has to know about items besides what the file system says: their types, what they inherit
// from the folder that they are in, and which of them have a receipt.
//
// Made once for an update, then constant and asked by several threads at once. Paths are absolute; names and
// paths are the file system's bytes.
#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "index/ContentTypes.h"
#include "index/StoragePosition.h"

namespace norvex {

// What items inherit from the folder that they are in.
struct CrawlPlace {
  bool inApplication = false;  // inside an application, at any depth
  bool holdsMessages = false;  // a folder of messages of a Maildir
};

class CrawlRules {
 public:
  // `dataHome`: the user's data folder, where Flatpak may have an installation.
  CrawlRules(ContentTypes types, std::string_view dataHome);

  const ContentTypes& types() const { return types_; }

  // Whether it is the type of a folder that people see as one file.
  bool isPackage(TypeId folderType) const { return folderType != plainFolder_; }

  // Where a regular file's size is counted.
  StoragePosition sizePosition(TypeId type, bool isExecutable, const CrawlPlace& place) const;

  // What a folder passes on to its items. `inMaildir`: it is a direct child of a Maildir.
  CrawlPlace placeInside(std::string_view path, std::string_view name, const CrawlPlace& around,
                         bool inMaildir) const;

  // Whether an item has a receipt because of where it is.
  bool fileHasReceipt(std::string_view folderPath, std::string_view name) const;
  bool folderHasReceipt(std::string_view path) const;

 private:
  ContentTypes types_;
  std::vector<std::string> flatpakInstallations_;
  TypeId plainFolder_;
};

}  // namespace norvex
