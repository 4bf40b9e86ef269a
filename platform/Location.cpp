#include "platform/Location.h"

#include <vector>

namespace norvex {
namespace {

constexpr std::string_view kHexDigits = "0123456789ABCDEF";

// Letters, digits and "-._~", whatever the locale says.
bool isUnreserved(unsigned char byte) {
  return (byte >= 'A' && byte <= 'Z') || (byte >= 'a' && byte <= 'z') || (byte >= '0' && byte <= '9') ||
         byte == '-' || byte == '.' || byte == '_' || byte == '~';
}

}  // namespace

Location Location::appending(std::string_view relativePath, bool isFolder) const {
  std::string path = path_;
  if (!path.empty() && path.back() != '/') path += '/';
  path += relativePath;
  return Location(std::move(path), isFolder);
}

std::string Location::urlText() const {
  std::string text = "file://";
  text.reserve(text.size() + path_.size() + 1);
  for (const char character : path_) {
    const auto byte = static_cast<unsigned char>(character);
    if (byte == '/' || isUnreserved(byte)) {
      text += character;
    } else {
      text += '%';
      text += kHexDigits[byte >> 4U];
      text += kHexDigits[byte & 0xFU];
    }
  }
  if (isFolder_ && text.back() != '/') text += '/';
  return text;
}

void Location::moveToItem(std::size_t folderLength, std::string_view name, const ItemFacts& facts) {
  path_.resize(folderLength);
  path_.append(name);
  isFolder_ = facts.error == 0 && facts.isDirectory;
  facts_ = facts;
}

std::string normalizedPath(std::string_view path) {
  const bool absolute = !path.empty() && path.front() == '/';
  std::vector<std::string_view> components;
  while (!path.empty()) {
    const std::size_t end = path.find('/');
    const std::string_view component = path.substr(0, end);
    path = end == std::string_view::npos ? std::string_view() : path.substr(end + 1);
    if (component.empty() || component == ".") continue;
    if (component == "..") {
      if (!components.empty()) components.pop_back();
      continue;
    }
    components.push_back(component);
  }
  std::string normalized = absolute ? "/" : "";
  for (const std::string_view component : components) {
    if (!normalized.empty() && normalized.back() != '/') normalized += '/';
    normalized += component;
  }
  return normalized;
}

std::string expandingTilde(std::string_view path, std::string_view homeFolder) {
  const bool startsWithHome = !path.empty() && path.front() == '~' && (path.size() == 1 || path[1] == '/');
  if (!startsWithHome) return std::string(path);
  std::string expanded(homeFolder);
  std::string_view rest = path.substr(1);
  if (!rest.empty() && !expanded.empty() && expanded.back() == '/') rest.remove_prefix(1);
  expanded += rest;
  return expanded;
}

}  // namespace norvex
