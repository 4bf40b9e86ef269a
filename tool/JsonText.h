// The values of the companion command's JSON documents. docs/norvexctl-json.md describes them to their
// readers.
//
// Any thread. Pure.
#pragma once

#include <nlohmann/json.hpp>
#include <string>
#include <string_view>

#include "platform/MetadataIndex.h"

namespace norvex {

// Members stay in the order in which they were set.
using JsonDocument = nlohmann::ordered_json;

// Rises when a reader of the present documents could no longer read the new ones.
inline constexpr int kJsonVersion = 1;

// Sets the member `name` to the text. JSON knows UTF-8 alone, names of files are any bytes: of those that are
// no UTF-8, U+FFFD stands for what cannot be shown, and the member `name` + "Bytes" holds all of them in
// base64.
void setText(JsonDocument& object, const std::string& name, std::string_view text);

// {"type": ..., "value": ...}, for a text that is no UTF-8 with "valueBytes".
JsonDocument jsonValue(const MetadataValue& value);

// As one line without a line feed; never fails.
std::string jsonLine(const JsonDocument& document);

// As people read it, with a line feed at its end.
std::string jsonPage(const JsonDocument& document);

std::string base64(std::string_view bytes);

}  // namespace norvex
