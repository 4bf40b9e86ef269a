// The content of the backup feature's settings file.
//
// A pure function of the text; any thread.
//
//     # comment            ; comment
//     [Backup]
//     AutomaticBackups=true|false                  default false
//     SkipSystemFiles=true|false                   default false
//     Destinations=place;place                     default none
//     IncludedVolumes=auto|mount point;mount point default auto
//
// Blanks at the ends of lines, around "=" and around ";" mean nothing; true and false may be written in any
// case. Keys and sections that are not known are passed over. Of a key that stands twice the last one holds.
#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <variant>
#include <vector>

namespace norvex {

struct BackupConfiguration {
  bool automaticBackups = false;
  bool skipSystemFiles = false;
  std::vector<std::string> destinations;
  // Absent: auto, that is, whatever volumes with user data are mounted.
  std::optional<std::vector<std::string>> includedVolumes;
};

// The first line that breaks the grammar.
struct BackupConfigurationFault {
  std::size_t line = 0;  // from 1
  std::string what;
};

// Either the whole configuration or its first fault.
std::variant<BackupConfiguration, BackupConfigurationFault> parseBackupConfiguration(std::string_view text);

}  // namespace norvex
