// What the session's journal has recorded.
#pragma once

#include <nlohmann/json.hpp>

#include <string>
#include <vector>

namespace norvex {

// The entries that match (FIELD=value, or an option of journalctl), oldest first: objects from field names to
// texts.
std::vector<nlohmann::json> journalEntries(const std::string& match);

// The one entry that matches, as soon as there is one; null when none comes or there are several.
nlohmann::json journalEntry(const std::string& match);

}  // namespace norvex
