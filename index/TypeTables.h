// What the project itself knows about content types, as tables. No logic.
//
// Read by ContentTypes and StorageClasses, on any thread. Texts live as long as the process.
#pragma once

#include <span>
#include <string_view>

#include "index/StoragePosition.h"

namespace norvex {

// Types of the project's own, beside those of the databases. They double as identifiers.
inline constexpr std::string_view kUnknownDataType = "public.data";
inline constexpr std::string_view kItemType = "public.item";
inline constexpr std::string_view kDirectoryType = "public.directory";
inline constexpr std::string_view kFolderType = "public.folder";
inline constexpr std::string_view kPackageType = "public.package";
inline constexpr std::string_view kSymbolicLinkType = "public.symlink";
inline constexpr std::string_view kSpecialFileType = "public.special-file";

// A file's extension that decides before every database, in any case of letters.
struct ExtensionRow {
  std::string_view extension;  // without its dot, no capitals
  std::string_view type;
};
std::span<const ExtensionRow> ownExtensions();

// What a package is by its extension. A package that is not named here is a kPackageType.
struct PackageRow {
  std::string_view ending;  // with its dot, no capitals
  std::string_view identifier;
  std::string_view kind;
};
std::span<const PackageRow> packageTypes();

// An identifier, a kind, or both, that a type has instead of the derived one; empty for the derived one.
struct WellKnownRow {
  std::string_view type;
  std::string_view identifier;
  std::string_view kind;
};
std::span<const WellKnownRow> wellKnownTypes();

// What types of a family conform to, besides being data. The first row that fits decides.
struct ConformanceRow {
  std::string_view typePattern;
  std::string_view conformsTo;
};
std::span<const ConformanceRow> conformances();

// The types that are counted at a position, as patterns, in the order in which the rows are asked.
struct PositionRow {
  StoragePosition position;
  std::string_view kind;  // of a type that has none of its own
  std::span<const std::string_view> typePatterns;
};
std::span<const PositionRow> positionRows();

// The names that types go by where no database is installed, in the form of a `globs2` file. Their weight is
// the lowest, so that they never win against a database.
std::string_view builtInGlobs();

}  // namespace norvex
