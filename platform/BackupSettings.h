// The settings of the system's backup feature.
//
// Called on the thread of the run.
#pragma once

#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace norvex {

// The settings as they were when they were opened; closed with the object.
class BackupSettingsHandle {
 public:
  virtual ~BackupSettingsHandle() = default;

  virtual bool automaticBackupsEnabled() const = 0;
  virtual std::vector<std::string> destinations() const = 0;
  virtual bool systemFilesSkipped() const = 0;

  // Mount points of the volumes that backups include, the startup volume as "/". May be empty; absent when
  // the feature does not say.
  virtual std::optional<std::vector<std::string>> includedVolumes() const = 0;
};

class BackupSettings {
 public:
  virtual ~BackupSettings() = default;

  // nullptr when the settings are not available.
  virtual std::unique_ptr<BackupSettingsHandle> open() = 0;
};

}  // namespace norvex
