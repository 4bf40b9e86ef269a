#include "tool/AttributeText.h"

#include <array>
#include <cstdio>
#include <type_traits>

#include "tool/FigureText.h"
#include "tool/SafeText.h"
#include "tool/StoragePositionNames.h"

namespace norvex {
namespace {

constexpr std::string_view kSizeAttribute = "kMDItemFSSize";

std::string numberText(double number) {
  std::array<char, 64> text{};
  std::snprintf(text.data(), text.size(), "%.17g", number);
  return text.data();
}

std::vector<std::string> positionLines(const std::vector<std::int64_t>& sizes) {
  std::vector<std::string> lines;
  for (std::size_t at = 0; at < sizes.size(); ++at) {
    lines.push_back(std::to_string(sizes[at]));
    if (at < kStoragePositionNames.size())
      lines.back() += std::string("  ") + kStoragePositionNames[at].label;
  }
  return lines;
}

std::vector<std::string> safeLines(const std::vector<std::string>& texts) {
  std::vector<std::string> lines;
  lines.reserve(texts.size());
  for (const std::string& text : texts) lines.push_back(safeText(text));
  return lines;
}

}  // namespace

std::vector<std::string> attributeLines(std::string_view name, const MetadataValue& value,
                                        const ByteCountFormatter& byteCounts) {
  const auto lines = [&](const auto& content) -> std::vector<std::string> {
    using Content = std::decay_t<decltype(content)>;
    if constexpr (std::is_same_v<Content, std::string>) {
      return {safeText(content)};
    } else if constexpr (std::is_same_v<Content, double>) {
      return {numberText(content)};
    } else if constexpr (std::is_same_v<Content, std::int64_t>) {
      std::string text = std::to_string(content);
      if (name == kSizeAttribute) text += " (" + byteCounts.string(static_cast<std::uint64_t>(content)) + ")";
      return {text};
    } else if constexpr (std::is_same_v<Content, MetadataDate>) {
      return {localTime(static_cast<std::int64_t>(content.secondsSince1970))};
    } else if constexpr (std::is_same_v<Content, std::vector<std::int64_t>>) {
      return positionLines(content);
    } else {
      return safeLines(content);
    }
  };
  std::vector<std::string> all = std::visit(lines, value);
  if (all.empty()) all.emplace_back();
  return all;
}

}  // namespace norvex
