#include "index/SparseAttributes.h"

#include <algorithm>
#include <charconv>
#include <string>

namespace norvex {
namespace {

constexpr std::string_view userNamespace = "user.";
constexpr std::string_view prefixes[] = {"kMDItem", "com_brixo_"};

// What every item has. A file could otherwise claim another path or size than its own.
constexpr std::string_view builtInAttributes[] = {
    "kMDItemPath",        "kMDItemFSName",          "kMDItemFSSize", "kMDItemFSContentChangeDate",
    "kMDItemContentType", "kMDItemContentTypeTree", "kMDItemKind",
};

bool takeDigits(std::string_view& text) {
  const std::size_t count = std::min(text.find_first_not_of("0123456789"), text.size());
  text.remove_prefix(count);
  return count > 0;
}

bool takeAnyOf(std::string_view& text, std::string_view characters) {
  if (text.empty() || characters.find(text.front()) == std::string_view::npos) return false;
  text.remove_prefix(1);
  return true;
}

enum class Form { text, whole, fractional };

Form formOf(std::string_view text) {
  takeAnyOf(text, "+-");
  if (!takeDigits(text)) return Form::text;
  if (text.empty()) return Form::whole;
  if (takeAnyOf(text, ".") && !takeDigits(text)) return Form::text;
  if (takeAnyOf(text, "eE")) {
    takeAnyOf(text, "+-");
    if (!takeDigits(text)) return Form::text;
  }
  return text.empty() ? Form::fractional : Form::text;
}

template <typename Number>
std::optional<Number> convert(std::string_view text) {
  // The conversion takes a minus sign only.
  if (text.starts_with('+')) text.remove_prefix(1);
  Number number{};
  const auto [stop, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  if (error != std::errc() || stop != text.data() + text.size()) return std::nullopt;
  return number;
}

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
  const Form form = formOf(text);
  if (form == Form::whole) {
    if (const auto integer = convert<std::int64_t>(text)) return *integer;
  }
  if (form != Form::text) {
    if (const auto number = convert<double>(text)) return *number;
  }
  return std::string(text);
}

}  // namespace norvex
