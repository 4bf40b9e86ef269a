#include "platform/linux/BackupConfiguration.h"

#include <algorithm>
#include <utility>

namespace norvex {
namespace {

using Texts = std::vector<std::string>;

constexpr std::string_view kSection = "Backup";
constexpr std::string_view kAutomatic = "auto";

std::string_view trimmed(std::string_view text) {
  constexpr std::string_view kBlanks = " \t\r\f\v";
  const std::size_t start = text.find_first_not_of(kBlanks);
  if (start == std::string_view::npos) return {};
  return text.substr(start, text.find_last_not_of(kBlanks) - start + 1);
}

// `lowerCase` in ASCII, whatever the locale.
bool equalsInAnyCase(std::string_view text, std::string_view lowerCase) {
  const auto lower = [](char letter) {
    return letter >= 'A' && letter <= 'Z' ? static_cast<char>(letter - 'A' + 'a') : letter;
  };
  return std::equal(text.begin(), text.end(), lowerCase.begin(), lowerCase.end(),
                    [&lower](char left, char right) { return lower(left) == right; });
}

// Each of these stores a value and says whether it can be one.
bool setBoolean(bool& setting, std::string_view value) {
  setting = equalsInAnyCase(value, "true");
  return setting || equalsInAnyCase(value, "false");
}

bool setTexts(Texts& setting, std::string_view value) {
  setting.clear();
  while (!value.empty()) {
    const std::size_t end = value.find(';');
    const std::string_view entry = trimmed(value.substr(0, end));
    if (!entry.empty()) setting.emplace_back(entry);
    value = end == std::string_view::npos ? std::string_view() : value.substr(end + 1);
  }
  return true;
}

bool setVolumes(std::optional<Texts>& setting, std::string_view value) {
  setting.reset();
  return value == kAutomatic || setTexts(setting.emplace(), value);
}

struct Key {
  std::string_view name;
  bool (*set)(BackupConfiguration&, std::string_view);
};
constexpr Key kKeys[] = {
    {"AutomaticBackups", [](BackupConfiguration& all,
                            std::string_view value) { return setBoolean(all.automaticBackups, value); }},
    {"SkipSystemFiles",
     [](BackupConfiguration& all, std::string_view value) { return setBoolean(all.skipSystemFiles, value); }},
    {"Destinations",
     [](BackupConfiguration& all, std::string_view value) { return setTexts(all.destinations, value); }},
    {"IncludedVolumes",
     [](BackupConfiguration& all, std::string_view value) { return setVolumes(all.includedVolumes, value); }},
};

class Parser {
 public:
  // What is wrong with the line, empty when nothing is.
  std::string readLine(std::string_view line) {
    line = trimmed(line);
    if (line.empty() || line.front() == '#' || line.front() == ';') return {};
    if (line.front() == '[') return readSection(line);
    return readAssignment(line);
  }

  BackupConfiguration take() { return std::move(configuration_); }

 private:
  std::string readSection(std::string_view line) {
    if (line.back() != ']') return "section without ]";
    inSection_ = line.substr(1, line.size() - 2) == kSection;
    return {};
  }

  std::string readAssignment(std::string_view line) {
    const std::size_t equals = line.find('=');
    if (equals == std::string_view::npos) return "neither [section] nor key=value";
    const std::string_view name = trimmed(line.substr(0, equals));
    if (name.empty()) return "value without a key";
    if (!inSection_) return {};
    const std::string_view value = trimmed(line.substr(equals + 1));
    for (const Key& key : kKeys) {
      if (key.name == name && !key.set(configuration_, value)) {
        return std::string(name) + " is neither true nor false";
      }
    }
    return {};
  }

  BackupConfiguration configuration_;
  bool inSection_ = false;
};

}  // namespace

std::variant<BackupConfiguration, BackupConfigurationFault> parseBackupConfiguration(std::string_view text) {
  Parser parser;
  for (std::size_t number = 1; !text.empty(); ++number) {
    const std::size_t end = text.find('\n');
    std::string what = parser.readLine(text.substr(0, end));
    if (!what.empty()) return BackupConfigurationFault{number, std::move(what)};
    text = end == std::string_view::npos ? std::string_view() : text.substr(end + 1);
  }
  return parser.take();
}

}  // namespace norvex
