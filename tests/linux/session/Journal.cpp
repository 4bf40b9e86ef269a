#include "Journal.h"

#include <sstream>

#include "Session.h"

namespace norvex {

std::vector<nlohmann::json> journalEntries(const std::string& match) {
  std::vector<nlohmann::json> entries;
  std::istringstream lines(outputOf("journalctl --quiet --all --output=json '" + match + "' 2>/dev/null"));
  for (std::string line; std::getline(lines, line);) entries.push_back(nlohmann::json::parse(line));
  return entries;
}

nlohmann::json journalEntry(const std::string& match) {
  std::vector<nlohmann::json> entries;
  eventually([&] {
    entries = journalEntries(match);
    return !entries.empty();
  });
  return entries.size() == 1 ? entries.front() : nlohmann::json();
}

}  // namespace norvex
