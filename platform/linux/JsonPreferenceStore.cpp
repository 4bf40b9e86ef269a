#include "platform/linux/JsonPreferenceStore.h"

#include <cerrno>
#include <filesystem>
#include <nlohmann/json.hpp>
#include <string_view>
#include <system_error>
#include <utility>

#include "platform/linux/FileReplacement.h"
#include "platform/linux/Files.h"

namespace norvex {
namespace {

using Json = nlohmann::ordered_json;

// A file beyond these is not one of ours. The depth bounds the recursion of writing it again.
constexpr std::size_t kLargestFile = std::size_t{1024} * 1024;
constexpr int kDeepestNesting = 64;

constexpr int kIndent = 2;
constexpr std::string_view kExtension = ".json";
constexpr std::string_view kDamagedExtension = ".damaged";
constexpr std::string_view kHexDigits = "0123456789ABCDEF";

// What is stored for a domain.
struct Stored {
  Json values = Json::object();
  bool damaged = false;  // there is a file, but it cannot be read or is no JSON object
};

Stored read(const std::string& path) {
  const Result<std::string> text = readWholeFile(path, kLargestFile);
  if (!text) return {Json::object(), text.error().code != ENOENT && text.error().code != ENOTDIR};
  bool tooDeep = false;
  const auto keepShallow = [&tooDeep](int depth, Json::parse_event_t, Json&) {
    if (depth > kDeepestNesting) tooDeep = true;
    return !tooDeep;
  };
  Json values = Json::parse(text.value(), keepShallow, /*allow_exceptions=*/false);
  if (tooDeep || !values.is_object()) return {Json::object(), true};
  return {std::move(values), false};
}

// The file that `path` leads to; itself when it is missing or a link that leads nowhere.
std::string resolved(const std::string& path) {
  std::error_code error;
  const std::filesystem::path target = std::filesystem::canonical(path, error);
  return error ? path : target.string();
}

bool standsForItself(char character, bool first) {
  return (character >= 'a' && character <= 'z') || (character >= 'A' && character <= 'Z') ||
         (character >= '0' && character <= '9') || character == '-' || character == '_' ||
         (character == '.' && !first);
}

}  // namespace

std::string JsonPreferenceStore::pathOf(const std::string& domain) const {
  std::string path = folder_ + '/';
  for (std::size_t at = 0; at < domain.size(); ++at) {
    if (standsForItself(domain[at], at == 0)) {
      path += domain[at];
      continue;
    }
    const auto byte = static_cast<unsigned char>(domain[at]);
    path += '%';
    path += kHexDigits[byte >> 4U];
    path += kHexDigits[byte & 0xFU];
  }
  return path.append(kExtension);
}

std::optional<double> JsonPreferenceStore::copyValue(const std::string& key, const std::string& domain) {
  const auto numbers = pending_.find(domain);
  if (numbers != pending_.end()) {
    const auto number = numbers->second.find(key);
    if (number != numbers->second.end()) return static_cast<double>(number->second);
  }
  const Json stored = read(pathOf(domain)).values;
  const auto value = stored.find(key);
  if (value == stored.end() || !value->is_number()) return std::nullopt;
  return value->get<double>();
}

void JsonPreferenceStore::setValue(const std::string& key, std::int64_t value, const std::string& domain) {
  pending_[domain][key] = value;
}

void JsonPreferenceStore::synchronize(const std::string& domain) {
  const auto numbers = pending_.find(domain);
  if (numbers == pending_.end()) return;
  if (makePrivateFolders(folder_) != 0) return;

  const std::string target = resolved(pathOf(domain));
  FileReplacement replacement(target);
  Stored stored = read(target);
  for (const auto& [key, number] : numbers->second) stored.values[key] = number;
  // Replacing is the one way of dumping that cannot throw.
  const std::string text = stored.values.dump(kIndent, ' ', false, Json::error_handler_t::replace) + '\n';
  const std::string keptAs = stored.damaged ? target + std::string(kDamagedExtension) : std::string();
  if (replacement.commit(text, keptAs) == 0) pending_.erase(numbers);
}

}  // namespace norvex
