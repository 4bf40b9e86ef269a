#include "index/SparseAttributes.h"

#include <algorithm>
#include <string>

#include "index/NumberText.h"

namespace norvex {
namespace {

constexpr std::string_view userNamespace = "user.";
constexpr std::string_view prefixes[] = {"kMDItem", "com_brixo_"};

// What every item has. A file could otherwise claim another path or size than its own.
constexpr std::string_view builtInAttributes[] = {
    "kMDItemPath",        "kMDItemFSName",          "kMDItemFSSize", "kMDItemFSContentChangeDate",
    "kMDItemContentType", "kMDItemContentTypeTree", "kMDItemKind",
};

}  // namespace

std::optional<std::string_view> sparseAttributeName(std::string_view extendedAttribute) {
  if (!extendedAttribute.starts_with(userNamespace)) return std::nullopt;
  const std::string_view name = extendedAttribute.substr(userNamespace.size());
  const bool isOurs = std::any_of(std::begin(prefixes), std::end(prefixes), [&](std::string_view prefix) {
    return name.size() > prefix.size() && name.starts_with(prefix);
  });
  const bool isBuiltIn = std::find(std::begin(builtInAttributes), std::end(builtInAttributes), name) !=
                         std::end(builtInAttributes);
  if (!isOurs || isBuiltIn) return std::nullopt;
  return name;
}

std::string_view withoutTerminator(std::string_view value) {
  if (value.ends_with('\n') || value.ends_with('\0')) value.remove_suffix(1);
  return value;
}

MetadataValue parseSparseValue(std::string_view value) {
  const std::string_view text = withoutTerminator(value);
  const auto number = numberFromText(text);
  if (number) return std::visit([](auto plain) { return MetadataValue(plain); }, *number);
  return std::string(text);
}

}  // namespace norvex
