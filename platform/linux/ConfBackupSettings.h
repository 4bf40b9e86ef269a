// The backup feature's settings from its INI file, chronel/backup.conf.
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "platform/BackupSettings.h"
#include "platform/SystemLog.h"

namespace norvex {

class ConfBackupSettings final : public BackupSettings {
 public:
  // `configFolders` are looked through in this order, the user's own first; the first that has the file
  // decides, whatever its content. `systemLog` outlives this object and the settings that it opens.
  ConfBackupSettings(std::vector<std::string> configFolders, SystemLog& systemLog,
                     std::string mountInfoPath = "/proc/self/mountinfo");

  // nullptr when no folder has the file, when it cannot be read, and when it is malformed. The last two are
  // told in the system log, as is a table of mounts that cannot be read for volumes that are to be found
  // automatically (which leaves them absent): all together with one line, the first, in the life of this
  // object.
  std::unique_ptr<BackupSettingsHandle> open() override;

 private:
  class Handle;

  std::unique_ptr<BackupSettingsHandle> openFile(const std::string& path, const std::string& text);
  std::optional<std::vector<std::string>> mountedVolumes();
  void tellOnce(const std::string& message);

  std::vector<std::string> configFolders_;
  SystemLog& systemLog_;
  std::string mountInfoPath_;
  bool told_ = false;
};

}  // namespace norvex
