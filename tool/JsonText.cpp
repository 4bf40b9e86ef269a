#include "tool/JsonText.h"

#include <array>
#include <cstdint>
#include <type_traits>
#include <variant>

#include "platform/Utf8.h"

namespace norvex {
namespace {

constexpr std::string_view kBase64Letters =
    "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";

std::string dump(const JsonDocument& document, int indent) {
  return document.dump(indent, ' ', false, JsonDocument::error_handler_t::replace);
}

// The text with U+FFFD for what is no UTF-8.
std::string readable(std::string_view text) {
  if (isValidUtf8(text)) return std::string(text);
  return JsonDocument::parse(dump(JsonDocument(std::string(text)), -1)).get<std::string>();
}

const char* typeName(const MetadataValue& value) {
  constexpr std::array<const char*, std::variant_size_v<MetadataValue>> kNames{"text", "number",  "number",
                                                                               "date", "numbers", "texts"};
  return kNames[value.index()];
}

}  // namespace

std::string base64(std::string_view bytes) {
  std::string text;
  for (std::size_t at = 0; at < bytes.size(); at += 3) {
    const std::string_view group = bytes.substr(at, 3);
    std::uint32_t bits = 0;
    for (std::size_t i = 0; i < 3; ++i) {
      bits = bits << 8U | (i < group.size() ? static_cast<unsigned char>(group[i]) : 0U);
    }
    for (std::size_t i = 0; i < 4; ++i) {
      text += i <= group.size() ? kBase64Letters[bits >> (18 - 6 * i) & 0x3FU] : '=';
    }
  }
  return text;
}

void setText(JsonDocument& object, const std::string& name, std::string_view text) {
  object[name] = readable(text);
  if (!isValidUtf8(text)) object[name + "Bytes"] = base64(text);
}

JsonDocument jsonValue(const MetadataValue& value) {
  JsonDocument object;
  object["type"] = typeName(value);
  const auto set = [&object](const auto& content) {
    using Content = std::decay_t<decltype(content)>;
    if constexpr (std::is_same_v<Content, std::string>) {
      setText(object, "value", content);
    } else if constexpr (std::is_same_v<Content, MetadataDate>) {
      object["value"] = content.secondsSince1970;
    } else {
      object["value"] = content;
    }
  };
  std::visit(set, value);
  return object;
}

std::string jsonLine(const JsonDocument& document) {
  return dump(document, -1);
}

std::string jsonPage(const JsonDocument& document) {
  return dump(document, 2) + "\n";
}

}  // namespace norvex
