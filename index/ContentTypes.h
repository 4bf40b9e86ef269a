// What items are, by their names: the content types of files, folders and everything else.
//
// Made once for a crawl, on any thread; then constant and used by any number of threads at once.
#pragma once

#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "index/MimeGlobs.h"
#include "index/StoragePosition.h"

namespace norvex {

// Numbers a type within one ContentTypes; another one may number it differently.
using TypeId = std::uint16_t;

struct ContentType {
  std::string identifier;         // "public.jpeg", "application/x-blender"
  std::string kind;               // for people: "JPEG image"
  std::vector<std::string> tree;  // the type itself, then everything it conforms to, the nearest first
  StoragePosition position = StoragePosition::other;  // of a regular file, by its type alone
  bool isKnown = true;  // false for the one type of files whose names say nothing
};

class ContentTypes {
 public:
  // Longer database files are cut after this many bytes. The usual one has 35 KB.
  static constexpr std::size_t kMaximumDatabaseBytes = std::size_t{4} << 20U;

  // The folders that databases are looked for in, the one that comes first decides first. `dataHome` is the
  // user's data folder.
  static std::vector<std::filesystem::path> defaultMimeFolders(const std::filesystem::path& dataHome);

  // Reads `globs2` in each of the folders, in their order of precedence. A file that is missing, no regular
  // file or unreadable is passed over, and so is every line that makes no sense. Where the databases together
  // know fewer names than the table that is built in, none is installed: the table then stands in behind
  // what they do say.
  static ContentTypes load(const std::vector<std::filesystem::path>& mimeFolders);

  // The type of a regular file; public.data when its name says nothing. `name` has no folders.
  TypeId ofFile(std::string_view name) const;

  // The type of a folder: of its package when its name or its mark (see kPackageMarkAttribute) makes it one.
  TypeId ofFolder(std::string_view name, bool packageMark) const;

  TypeId symbolicLink() const { return symbolicLink_; }
  // Sockets, devices, FIFOs.
  TypeId other() const { return other_; }

  // `id` is below size().
  const ContentType& type(TypeId id) const { return types_[id]; }
  std::size_t size() const { return types_.size(); }

 private:
  ContentTypes() = default;
  void readDatabases(const std::vector<std::filesystem::path>& mimeFolders);
  void addFixedTypes();
  void addPackageTypes();
  void addFileTypes();
  TypeId add(ContentType type);
  TypeId addFileType(std::string_view name);

  std::vector<ContentType> types_;
  MimeGlobs globs_;
  std::vector<TypeId> typeOfGlob_;                     // by the globs' numbers
  std::vector<TypeId> typeOfExtension_;                // in the order of the project's own extensions
  std::vector<TypeId> typeOfPackage_;                  // in the order of the packages
  std::unordered_map<std::string, TypeId> fileTypes_;  // by MIME type or the project's own
  TypeId unknown_ = 0;
  TypeId folder_ = 0;
  TypeId package_ = 0;
  TypeId symbolicLink_ = 0;
  TypeId other_ = 0;
};

}  // namespace norvex
