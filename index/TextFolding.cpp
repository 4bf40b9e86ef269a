#include "index/TextFolding.h"

#include <utf8proc.h>

#include <cstdlib>
#include <memory>

namespace norvex {
namespace {

struct FreeDeleter {
  void operator()(utf8proc_uint8_t* memory) const { std::free(memory); }
};

const utf8proc_uint8_t* bytesOf(std::string_view text) {
  return reinterpret_cast<const utf8proc_uint8_t*>(text.data());
}

// How many bytes at the front of `text` are whole characters.
std::size_t validPrefix(std::string_view text) {
  std::size_t length = 0;
  while (length < text.size()) {
    utf8proc_int32_t character = 0;
    const auto rest = text.substr(length);
    const auto step = utf8proc_iterate(bytesOf(rest), static_cast<utf8proc_ssize_t>(rest.size()), &character);
    if (step <= 0) break;
    length += static_cast<std::size_t>(step);
  }
  return length;
}

utf8proc_option_t optionsOf(TextFolding folding) {
  int options = UTF8PROC_STABLE | UTF8PROC_COMPOSE;
  if (folding.ignoresCase) options |= UTF8PROC_CASEFOLD;
  if (folding.ignoresDiacritics) options |= UTF8PROC_STRIPMARK;
  return static_cast<utf8proc_option_t>(options);
}

void appendFolded(std::string& result, std::string_view valid, TextFolding folding) {
  utf8proc_uint8_t* memory = nullptr;
  const auto length =
      utf8proc_map(bytesOf(valid), static_cast<utf8proc_ssize_t>(valid.size()), &memory, optionsOf(folding));
  const std::unique_ptr<utf8proc_uint8_t, FreeDeleter> owner(memory);
  if (length < 0) {
    result += valid;  // no memory or a text of gigabytes: exact comparison is what is left
    return;
  }
  result.append(reinterpret_cast<const char*>(memory), static_cast<std::size_t>(length));
}

}  // namespace

std::string foldedText(std::string_view text, TextFolding folding) {
  if (folding.changesNothing()) return std::string(text);
  std::string result;
  while (!text.empty()) {
    const std::size_t valid = validPrefix(text);
    if (valid > 0) appendFolded(result, text.substr(0, valid), folding);
    text.remove_prefix(valid);
    if (text.empty()) break;
    result += text.front();
    text.remove_prefix(1);
  }
  return result;
}

}  // namespace norvex
