#include "platform/linux/ConfBackupSettings.h"

#include <cerrno>
#include <utility>
#include <variant>

#include "platform/linux/BackupConfiguration.h"
#include "platform/linux/Files.h"
#include "platform/linux/UserDataVolumes.h"

namespace norvex {
namespace {

constexpr const char* kFileInFolder = "/chronel/backup.conf";
constexpr std::size_t kLargestFile = std::size_t{1024} * 1024;

bool isMissing(const Error& error) {
  return error.code == ENOENT || error.code == ENOTDIR;
}

}  // namespace

class ConfBackupSettings::Handle final : public BackupSettingsHandle {
 public:
  Handle(ConfBackupSettings& settings, BackupConfiguration configuration)
      : settings_(settings), configuration_(std::move(configuration)) {}

  bool automaticBackupsEnabled() const override { return configuration_.automaticBackups; }
  std::vector<std::string> destinations() const override { return configuration_.destinations; }
  bool systemFilesSkipped() const override { return configuration_.skipSystemFiles; }

  std::optional<std::vector<std::string>> includedVolumes() const override {
    if (configuration_.includedVolumes) return configuration_.includedVolumes;
    return settings_.mountedVolumes();
  }

 private:
  ConfBackupSettings& settings_;
  BackupConfiguration configuration_;
};

ConfBackupSettings::ConfBackupSettings(std::vector<std::string> configFolders, SystemLog& systemLog,
                                       std::string mountInfoPath)
    : configFolders_(std::move(configFolders)),
      systemLog_(systemLog),
      mountInfoPath_(std::move(mountInfoPath)) {}

std::unique_ptr<BackupSettingsHandle> ConfBackupSettings::open() {
  for (const std::string& folder : configFolders_) {
    const std::string path = folder + kFileInFolder;
    const Result<std::string> text = readWholeFile(path, kLargestFile);
    if (text) return openFile(path, text.value());
    if (isMissing(text.error())) continue;
    tellOnce("Unreadable backup settings: " + path + ": " + text.error().description);
    return nullptr;
  }
  return nullptr;
}

std::unique_ptr<BackupSettingsHandle> ConfBackupSettings::openFile(const std::string& path,
                                                                   const std::string& text) {
  auto parsed = parseBackupConfiguration(text);
  if (const auto* fault = std::get_if<BackupConfigurationFault>(&parsed)) {
    tellOnce("Malformed backup settings: " + path + ":" + std::to_string(fault->line) + ": " + fault->what);
    return nullptr;
  }
  return std::make_unique<Handle>(*this, std::get<BackupConfiguration>(std::move(parsed)));
}

std::optional<std::vector<std::string>> ConfBackupSettings::mountedVolumes() {
  Result<std::vector<std::string>> volumes = userDataVolumes(mountInfoPath_);
  if (volumes) return std::move(volumes).value();
  tellOnce("Unreadable table of mounts: " + mountInfoPath_ + ": " + volumes.error().description);
  return std::nullopt;
}

void ConfBackupSettings::tellOnce(const std::string& message) {
  if (!told_) systemLog_.syslog(LogLevel::error, message);
  told_ = true;
}

}  // namespace norvex
