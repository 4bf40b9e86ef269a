#include "index/ContentTypes.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <utility>

#include "index/AsciiCase.h"
#include "index/GlobPattern.h"
#include "index/StorageClasses.h"
#include "index/TypeTables.h"
#include "platform/PackageNames.h"

namespace norvex {
namespace {

// The type that databases give to names of which they know that they say nothing.
constexpr std::string_view unknownMimeType = "application/octet-stream";

class OpenFile {
 public:
  // Does not wait: a FIFO in a database's place must not hold up the crawl.
  explicit OpenFile(const std::filesystem::path& path)
      : descriptor_(::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK | O_NOCTTY)) {}
  ~OpenFile() {
    if (descriptor_ >= 0) ::close(descriptor_);
  }
  OpenFile(const OpenFile&) = delete;
  OpenFile& operator=(const OpenFile&) = delete;

  bool isRegularFile() const {
    struct stat status {};
    return descriptor_ >= 0 && ::fstat(descriptor_, &status) == 0 && S_ISREG(status.st_mode);
  }

  // What is there, up to the limit; an error ends the text like the end of the file.
  std::string read(std::size_t limit) const {
    std::string text;
    std::array<char, 32768> block;
    while (text.size() < limit) {
      const ssize_t count = ::read(descriptor_, block.data(), std::min(block.size(), limit - text.size()));
      if (count < 0 && errno == EINTR) continue;
      if (count <= 0) break;
      text.append(block.data(), static_cast<std::size_t>(count));
    }
    return text;
  }

 private:
  int descriptor_;
};

// The text of a database; empty when there is none.
std::string readDatabase(const std::filesystem::path& path) {
  const OpenFile file(path);
  if (!file.isRegularFile()) return {};
  std::string text = file.read(ContentTypes::kMaximumDatabaseBytes);
  // Half a line would be another entry than the one that was cut.
  if (text.size() == ContentTypes::kMaximumDatabaseBytes) text.erase(text.rfind('\n') + 1);
  return text;
}

// The row of the project's own extensions that the name ends with; their number when there is none.
std::size_t ownExtensionRow(std::string_view name) {
  const auto rows = ownExtensions();
  const std::size_t dot = name.rfind('.');
  if (dot == std::string_view::npos) return rows.size();
  const std::string_view extension = name.substr(dot + 1);
  const auto fits = [&](const ExtensionRow& row) {
    return row.extension.size() == extension.size() && endsWithIgnoringCase(extension, row.extension);
  };
  return static_cast<std::size_t>(std::find_if(rows.begin(), rows.end(), fits) - rows.begin());
}

const WellKnownRow* wellKnown(std::string_view type) {
  for (const WellKnownRow& row : wellKnownTypes()) {
    if (row.type == type) return &row;
  }
  return nullptr;
}

// "image/x-canon-cr2" -> "CANON-CR2"
std::string formatName(std::string_view type) {
  std::string_view name = type.substr(type.find('/') + 1);
  for (const std::string_view prefix : {"x-", "vnd."}) {
    if (name.starts_with(prefix)) name.remove_prefix(prefix.size());
  }
  std::string result(name.substr(0, name.find('+')));
  for (char& character : result) {
    if (character >= 'a' && character <= 'z') character = static_cast<char>(character - 'a' + 'A');
  }
  return result;
}

std::string derivedKind(std::string_view type, StoragePosition position) {
  if (position == StoragePosition::images) return formatName(type) + " image";
  if (position == StoragePosition::music) return formatName(type) + " audio";
  if (position == StoragePosition::movies) return formatName(type) + " movie";
  for (const PositionRow& row : positionRows()) {
    if (row.position == position) return std::string(row.kind);
  }
  return "Document";
}

std::vector<std::string> fileTree(std::string_view type, const std::string& identifier) {
  std::vector<std::string> tree{identifier};
  for (const ConformanceRow& row : conformances()) {
    if (!globMatches(row.typePattern, type)) continue;
    tree.emplace_back(row.conformsTo);
    break;
  }
  tree.emplace_back(kUnknownDataType);
  tree.emplace_back(kItemType);
  return tree;
}

ContentType describeFileType(std::string_view name) {
  ContentType type;
  type.position = positionOfType(name);
  const WellKnownRow* const row = wellKnown(name);
  type.identifier = row != nullptr && !row->identifier.empty() ? row->identifier : name;
  type.kind =
      row != nullptr && !row->kind.empty() ? std::string(row->kind) : derivedKind(name, type.position);
  type.tree = fileTree(name, type.identifier);
  return type;
}

// A type that is not found by a file's name.
ContentType fixedType(std::string_view identifier, std::string_view kind,
                      std::initializer_list<std::string_view> parents) {
  ContentType type;
  type.identifier = identifier;
  type.kind = kind;
  type.tree.emplace_back(identifier);
  type.tree.insert(type.tree.end(), parents.begin(), parents.end());
  return type;
}

}  // namespace

std::vector<std::filesystem::path> ContentTypes::defaultMimeFolders(const std::filesystem::path& dataHome) {
  return {dataHome / "mime", "/usr/local/share/mime", "/usr/share/mime"};
}

ContentTypes ContentTypes::load(const std::vector<std::filesystem::path>& mimeFolders) {
  ContentTypes types;
  types.readDatabases(mimeFolders);
  types.addFixedTypes();
  types.addPackageTypes();
  types.addFileTypes();
  return types;
}

void ContentTypes::readDatabases(const std::vector<std::filesystem::path>& mimeFolders) {
  for (const std::filesystem::path& folder : mimeFolders) globs_.addDatabase(readDatabase(folder / "globs2"));
  // A handful of entries of the user's own is no database: without the table, pictures would be unknown data.
  MimeGlobs builtIn;
  builtIn.addDatabase(builtInGlobs());
  if (globs_.patternCount() < builtIn.patternCount()) globs_.addDatabase(builtInGlobs());
}

TypeId ContentTypes::add(ContentType type) {
  types_.push_back(std::move(type));
  return static_cast<TypeId>(types_.size() - 1);
}

void ContentTypes::addFixedTypes() {
  ContentType unknown = fixedType(kUnknownDataType, "Document", {kItemType});
  unknown.isKnown = false;
  unknown_ = add(std::move(unknown));
  folder_ = add(fixedType(kFolderType, "Folder", {kDirectoryType, kItemType}));
  package_ = add(fixedType(kPackageType, "Package", {kDirectoryType, kItemType}));
  symbolicLink_ = add(fixedType(kSymbolicLinkType, "Symbolic Link", {kItemType}));
  other_ = add(fixedType(kSpecialFileType, "Special File", {kItemType}));
}

void ContentTypes::addPackageTypes() {
  for (const PackageRow& row : packageTypes()) {
    const auto same = std::find_if(types_.begin(), types_.end(), [&](const ContentType& type) {
      return type.identifier == row.identifier;
    });
    typeOfPackage_.push_back(
        same != types_.end()
            ? static_cast<TypeId>(same - types_.begin())
            : add(fixedType(row.identifier, row.kind, {kPackageType, kDirectoryType, kItemType})));
  }
}

void ContentTypes::addFileTypes() {
  fileTypes_.emplace(unknownMimeType, unknown_);
  for (const ExtensionRow& row : ownExtensions()) typeOfExtension_.push_back(addFileType(row.type));
  for (const std::string& type : globs_.types()) typeOfGlob_.push_back(addFileType(type));
}

TypeId ContentTypes::addFileType(std::string_view name) {
  const auto [place, isNew] = fileTypes_.try_emplace(std::string(name), TypeId{0});
  if (isNew) place->second = add(describeFileType(name));
  return place->second;
}

TypeId ContentTypes::ofFile(std::string_view name) const {
  const std::size_t own = ownExtensionRow(name);
  if (own < typeOfExtension_.size()) return typeOfExtension_[own];
  const auto number = globs_.typeOfName(name);
  return number ? typeOfGlob_[*number] : unknown_;
}

TypeId ContentTypes::ofFolder(std::string_view name, bool packageMark) const {
  if (!packageMark && !isPackageName(name)) return folder_;
  const auto rows = packageTypes();
  const auto fits = [&](const PackageRow& row) { return endsWithIgnoringCase(name, row.ending); };
  const auto row = std::find_if(rows.begin(), rows.end(), fits);
  return row == rows.end() ? package_ : typeOfPackage_[static_cast<std::size_t>(row - rows.begin())];
}

}  // namespace norvex
